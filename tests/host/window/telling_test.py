#!/usr/bin/python3
"""What a rider is told by window, bar and timer together, on a bus and before a notification service of the test's own.
usage: telling_test.py NIMBO_TRANSIT_DESKTOP NIMBO_TRANSIT NIMBO_TRANSIT_NOTICES SERVICE_FILE GTFS_REALTIME_PROTO"""
import json
import os
import pathlib
import subprocess
import sys
import tempfile
import time

from notifications import NotificationService, start_bus, wait
from window_session import Session, press

desktop, command_line, notices, service_file, proto = sys.argv[1:]
ALL_DAYS = "sun,mon,tue,wed,thu,fri,sat"


def publish(folder, *alerts):
    """Writes a city's feed with an alert for each header, its lines and its severity."""
    folder.mkdir(exist_ok=True)
    folder.joinpath("agency.txt").write_text(
        "agency_id,agency_name,agency_url,agency_timezone\nM,Metro,https://example.org,UTC\n")
    folder.joinpath("routes.txt").write_text(
        "route_id,agency_id,route_short_name,route_long_name,route_type\nm1,M,1,Harbour,1\nm2,M,2,Castle,1\nm3,M,3,Ring,1\n")
    text = f"header {{ gtfs_realtime_version: '2.0' timestamp: {int(time.time())} }}"
    for number, header, lines, severity in alerts:
        selectors = " ".join(f"informed_entity {{ route_id: '{line}' }}" for line in lines)
        text += (f"entity {{ id: '{number}' alert {{ {selectors} effect: 3 severity_level: {severity} "
                 f"header_text {{ translation {{ text: '{header}' }} }} }} }}")
    alert_bytes = subprocess.run(["protoc", "-I", os.path.dirname(proto), "--encode=transit_realtime.FeedMessage",
                                  os.path.basename(proto)], input=text.encode(), capture_output=True, check=True).stdout
    folder.joinpath("new").write_bytes(alert_bytes)
    folder.joinpath("new").rename(folder / "alerts.pb")


def ended(process, status=0):
    """What a program printed, once it has ended; meanwhile the notification service answers."""
    wait(f"the end of {process.args}", lambda: process.poll() is not None)
    output = "".join(text or "" for text in process.communicate())
    assert process.returncode == status, (process.args, output)
    return output


def run(*arguments, status=0):
    return ended(subprocess.Popen([command_line, *arguments], text=True, stdout=subprocess.PIPE, stderr=subprocess.PIPE),
                 status)


def incidents():
    lines = json.loads(run("status", "--format", "json"))["lines"]
    return {incident["title"]: incident for line in lines for incident in line["incidents"]}


with tempfile.TemporaryDirectory() as folder, Session(folder) as session:
    bus, address = start_bus(folder, {"org.nimbo.Transit.Notices.service": (open(service_file).read(), notices)})
    session.callback(bus.wait)
    session.callback(bus.kill)
    session.environment["DBUS_SESSION_BUS_ADDRESS"] = os.environ["DBUS_SESSION_BUS_ADDRESS"] = address
    session.environment["GTK_A11Y"] = "none"
    service = NotificationService(address)
    city = pathlib.Path(folder, "city")
    before = ("a", "Stairs are wet", ["m1"], 3)

    def publish_and_ask(*alerts):
        """All that runs hears of it at the same time: the timer twice, a bar that starts, and the window."""
        publish(city, *alerts)
        with open(city / "bar", "w+") as shown:
            bar = session.start([command_line, "status", "--waybar", "--watch", "--notify"], stdout=shown)
            timers = [subprocess.Popen([command_line, "update", "--notify"], text=True, stdout=subprocess.PIPE,
                                       stderr=subprocess.PIPE) for _ in range(2)]
            press("key", "F5")
            for timer in timers:
                ended(timer)
            wait("the bar", lambda: any('"old"' not in line for line in pathlib.Path(shown.name).read_text().splitlines()))
            bar.terminate()
            wait("its end", lambda: bar.poll() == 0)

    publish(city, before)
    run("feed", "add", "city", "--static", city, "--alerts", city / "alerts.pb")
    run("favorite", "add", "city:m1", "city:m2", "city:m3")
    run("settings", "set", "notify", "on")
    window = session.start([desktop])

    def xdotool(*arguments):
        return subprocess.run(["xdotool", *arguments], capture_output=True, text=True).stdout.strip()

    def see_title(title):
        wait(f"{title}; there is {title_of()}", lambda: title_of() == title)

    def title_of():
        return xdotool("getwindowname", xdotool("search", "--onlyvisible", "--pid", str(window.pid)))

    see_title("1 new – Nimbo Transit")
    press("windowfocus", xdotool("search", "--onlyvisible", "--pid", str(window.pid)))
    publish_and_ask(before)
    assert not service.shown, ("what ran before", service.shown)

    signals = ("b", "Signals fail", ["m1", "m2", "m3"], 3)
    publish_and_ask(before, signals)
    told = service.see("1, 2, 3: Signals fail")
    assert len(service.shown) == 1, service.shown
    assert service.standing[told]["hints"]["urgency"] == 1 and "Significant delays" in service.standing[told]["body"]
    see_title("2 new – Nimbo Transit")

    signals = ("b", "Signals fail at the harbour", ["m1", "m2", "m3"], 3)
    publish_and_ask(before, signals)
    assert service.see("1, 2, 3: Signals fail at the harbour") == told
    assert len(service.shown) == 2, service.shown

    # A click opens the incident's page, and so it has been seen.
    service.click(told)
    see_title("Incidents")
    wait("that it was seen", lambda: not incidents()["Signals fail at the harbour"]["new"])
    assert incidents()["Stairs are wet"]["new"]
    press("key", "Escape")
    see_title("1 new – Nimbo Transit")

    publish_and_ask(before)
    over = service.see("1 incident has ended")
    assert "Signals fail at the harbour" in service.standing[over]["body"]
    assert len(service.shown) == 3, service.shown

    # In quiet hours nothing is told; then what still runs, but for what was seen meanwhile.
    run("settings", "set", "quietDays", ALL_DAYS)
    run("settings", "set", "quietHours", "around noon", status=1)
    night = [("c", "Night works", ["m2"], 3), ("d", "Fog", ["m3"], 4), ("e", "Ice", ["m3"], 3), ("f", "Rain", ["m1"], 3)]
    publish_and_ask(before, *night)
    ended(session.start([desktop, "nimbo://incident?id=" + incidents()["Ice"]["id"]]))
    wait("that it was seen", lambda: not incidents()["Ice"]["new"])
    press("key", "Escape")
    publish_and_ask(before, *night[:3])
    assert len(service.shown) == 3, service.shown
    run("settings", "unset", "quietDays")
    publish_and_ask(before, *night[:3])
    summary = service.see("2 Advisories")
    assert service.standing[summary]["body"].splitlines() == ["3, Ring: Fog", "2, Castle: Night works"]
    assert service.standing[summary]["hints"]["urgency"] == 2 and len(service.shown) == 4, service.shown

    # What cannot be shown is told later, and what cannot be kept is not told.
    press("key", "ctrl+q")
    wait("its end", lambda: window.poll() == 0)
    service.leave()
    flood = ("g", "Flood", ["m2"], 3)
    publish(city, before, *night[:3], flood)
    assert "cannot notify" in run("update", "--notify", status=1)
    service = NotificationService(address, first_id=100)
    assert "/dev/null" in run("--state", "/dev/null/state", "update", "--notify", status=1)
    run("update", "--notify")
    service.see("2, Castle: Flood")
    run("settings", "set", "notify", "off")
    publish(city)
    run("update")
    assert len(service.shown) == 1, service.shown
print("told")
