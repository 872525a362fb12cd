#!/usr/bin/python3
"""What a rider is told by window, bar and timer together, on a bus and before a notification service of the test's own.
usage: telling_test.py NIMBO_TRANSIT_DESKTOP NIMBO_TRANSIT NIMBO_TRANSIT_NOTICES SERVICE_FILE"""
import json
import os
import pathlib
import subprocess
import sys
import tempfile

from cities import publish
from notifications import NotificationService, start_bus, wait
from window_session import Session, Window, press

desktop, command_line, notices, service_file = sys.argv[1:]


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
    address = start_bus(session, folder, {"org.nimbo.Transit.Notices.service": (open(service_file).read(), notices)})
    session.environment["DBUS_SESSION_BUS_ADDRESS"] = os.environ["DBUS_SESSION_BUS_ADDRESS"] = address
    session.environment["GTK_A11Y"] = "none"
    service = NotificationService(address)
    city = pathlib.Path(folder, "city")
    before = ("a", "Stairs are wet", ["m1"], 3)

    def publish_and_ask(*alerts):
        """All that runs hears of it at the same time: the timer twice, a bar that starts, and the window."""
        publish(city, alerts)
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

    publish(city, [before])
    run("feed", "add", "city", "--static", city, "--alerts", city / "alerts.pb")
    run("favorite", "add", "city:m1", "city:m2", "city:m3")
    run("settings", "set", "notify", "on")
    window = Window(session, desktop)

    def title_of():
        return subprocess.run(["xdotool", "getwindowname", *window.surfaces()], capture_output=True, text=True).stdout.strip()

    def see_title(title):
        wait(f"{title}; there is {title_of()}", lambda: title_of() == title)

    see_title("1 new – Nimbo Transit")
    window.comes_to_front()
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
    press("key", "Escape")
    see_title("1 new – Nimbo Transit")

    publish_and_ask(before)
    over = service.see("1 incident has ended")
    assert "Signals fail at the harbour" in service.standing[over]["body"]
    assert len(service.shown) == 3, service.shown

    # In quiet hours nothing is told; then what still runs.
    run("settings", "set", "quietDays", "sun,mon,tue,wed,thu,fri,sat")
    night = [("c", "Night works", ["m2"], 3), ("d", "Fog", ["m3"], 4)]
    publish_and_ask(before, *night)
    assert len(service.shown) == 3, service.shown
    run("settings", "unset", "quietDays")
    publish_and_ask(before, *night)
    summary = service.see("2 Advisories")
    assert service.standing[summary]["body"].splitlines() == ["3, Ring: Fog", "2, Castle Line: Night works"]
    assert service.standing[summary]["hints"]["urgency"] == 2 and len(service.shown) == 4, service.shown

    # What cannot be shown is told later, and what cannot be kept is not told.
    press("key", "ctrl+q")
    wait("its end", lambda: window.process.poll() == 0)
    service.leave()
    flood = ("g", "Flood", ["m2"], 3)
    publish(city, [before, *night, flood])
    assert "cannot notify" in run("update", "--notify", status=1)
    service = NotificationService(address, first_id=100)
    assert "/dev/null" in run("--state", "/dev/null/state", "update", "--notify", status=1)
    run("update", "--notify")
    service.see("2, Castle Line: Flood")
    run("settings", "set", "notify", "off")
    publish(city, [])
    run("update")
    assert len(service.shown) == 1, service.shown
print("told")
