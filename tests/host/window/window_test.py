#!/usr/bin/python3
"""The window as its user has it. usage: window_test.py tour|faults|catalog|bus NIMBO_TRANSIT_DESKTOP NIMBO_TRANSIT WIDGET"""
import base64
import bz2
import configparser
import http.server
import json
import os
import pathlib
import re
import shutil
import signal
import socket
import sqlite3
import stat
import subprocess
import sys
import tempfile
import threading
import time
import types
import urllib.parse
import zipfile

from cities import publish
from city import Widget
from gi.repository import Gio, GLib
from notifications import PATIENCE, wait
from window_session import Session, Window, press

desktop, command_line, widget = sys.argv[2:]


def sample_activity_url(folder):
    """What a row of the sample city hands over, as an address."""
    sample = Widget([widget, "--config", folder, "--state", folder])
    sample.call(("initialize", {"locale": "en", "displayModes": {"compact": [359, 110], "expanded": [359, 440]},
                                "bundle": {"kind": "application", "identifier": "org.example.Host"}}),
                "loadView", "viewWillAppear", "viewDidAppear", "performUpdate")
    sample.send(("setActiveDisplayMode", {"mode": "expanded"}), ("selectRow", {"section": 0, "row": 1}))
    activity = next(line["params"] for line in map(json.loads, sample.process.stdout)
                    if line.get("method") == "openUserActivity")
    sample.close()
    record = base64.b64decode(activity["userInfo"]["bs"])
    decoded = subprocess.run([command_line, "decode", "-"], input=record, capture_output=True, check=True).stdout
    assert json.loads(decoded)["NimboActivity"]["displayOptions"] == {"mapType": 3}, decoded
    return "nimbo://activity?" + urllib.parse.urlencode({"type": activity["activityType"], **activity["userInfo"]})


def tour(session, folder):
    city = os.path.join(folder, "city")
    publish(city, ["Signals fail", "Lift is out", "Stairs are wet", "Music plays"])
    window = Window(session, desktop)
    window.see("4 Advisories", "push button")
    window.comes_to_front()

    window.click("Set Up a Feed")
    window.see_page("Feeds")
    window.click("By Address")
    window.fill(("Name", "town"), ("Lines", city), ("Incidents", city + "/alerts.pb"))
    window.see_page("Favorites")  # what comes after the first feed
    press("key", "alt+Left")
    window.see("3 lines, 1 agency")
    window.see("4 incidents")
    press("key", "Escape")

    window.click("Favorites", "list item")
    window.see_page("Favorites")
    window.see("1, Harbour Line, Metro", "list item")
    for search, line in ("castle", "2, Castle Line"), ("harbour", "1, Harbour Line"):
        press("key", "ctrl+a", "type", search)
        wait("one line found", lambda: sum(node.get_role_name() == "list item" for node in window.nodes()) == 1)
        window.click(f"Add {line} to favorites")
        window.see(f"Remove {line} from favorites")
        window.click("Search", "entry")
    press("key", "Escape")
    window.click("Move 1, Harbour Line up")

    def is_order(*lines):
        return lambda: [node.get_name()[:1] for node in window.nodes() if node.get_role_name() == "list item"][:2] == [*lines]
    wait("the new order", is_order("1", "2"))
    window.drag("2, Castle Line, Metro", "1, Harbour Line, Metro", is_order("2", "1"))
    window.click("Remove 2, Castle Line from favorites")
    wait("one favorite", lambda: not window.find("Move 2, Castle Line"))
    window.click("Undo")
    wait("the old place", is_order("2", "1"))
    window.click("Move 1, Harbour Line up")
    wait("the new order again", is_order("1", "2"))
    window.click("Search", "entry")
    press("key", "Escape")

    window.see("1, Harbour Line, .*4 Advisories", "push button")
    window.see("Do you want to be told when incidents")
    window.click("Not Now")
    wait("no question any more", lambda: not window.find("Do you want to be told"))
    assert subprocess.run([command_line, "settings", "get", "notify"], capture_output=True).stdout == b"off\n"
    for value, isMarked in ("severe", True), ("off", False):  # by another program
        subprocess.run([command_line, "settings", "set", "notify", value], check=True)
        window.click("Menu")
        wait(f"the mark of {value}", lambda: window.is_checked("Notifications", "menu item") == isMarked)
        press("key", "Escape")
    wait("what is new", lambda: window.frame().get_name() == "4 new – Nimbo Transit")
    window.click("4 Advisories")
    for text in "Incidents", "Signals fail", "Music plays", "^As of ":
        window.see(text)
    window.click("Mark as Seen")
    press("key", "Escape")
    wait("nothing new", lambda: window.frame().get_name() == "Nimbo Transit")
    window.click("Show More")
    for row, page, text in (("1, Harbour Line, .*Signals fail", "1, Harbour Line", "Signals fail"),
                            ("Music plays", "1, Harbour Line", "Music plays"),
                            ("Good Service", "Favorites", "Castle Line")):
        window.click(row)
        window.see_page(page)
        window.see(text)
        press("key", "alt+Left")
        window.see_page("Nimbo Transit")
    press("key", "Up", "Up", "Return")  # the keyboard goes on from the row
    window.see_page("1, Harbour Line")
    press("key", "alt+Left")

    os.remove(city + "/alerts.pb")  # what other programs do shows by itself
    window.see("^Feed “town”: .*/alerts.pb")
    window.click("Try Again")
    publish(city, ["A bridge is up"])
    window.see("A bridge is up", "push button")
    wait("no failure any more", lambda: not window.find("^Feed “town”"))
    for news in "Cows walk the track", "The cows are gone", None:
        old = window.children()
        if news:
            publish(city, [news])
        os.kill(int(old[0]), signal.SIGKILL)
        if news:
            wait("another widget process", lambda: set(window.children()) - set(old))
            window.see(news, "push button")
    window.see("cannot be shown: .*3 times within a minute")
    window.see("the last time since it ended")
    assert not window.children()
    window.click("Try Again")
    window.see("The cows are gone", "push button")

    publish(os.path.join(folder, "other"), [])
    subprocess.run([command_line, "feed", "add", "other", "--static", folder + "/other", "--alerts",
                    folder + "/other/alerts.pb"], check=True)
    subprocess.run([command_line, "favorite", "add", "other:m3"], check=True)
    press("key", "F5")
    window.see("3 other lines|2 other lines", "push button")
    assert len(window.children()) == 1

    for url, sight in (("http://example.org/", "“http://example.org/” cannot be opened here"),
                       ("nimbo://activity?type=org.nimbo.Map.Transit.Incident&bs=AAAA", "cannot be shown"),
                       ("nimbo://line?id=town:none", "No line “town:none” is known"),
                       ("nimbo://incident?id=1", "is over, or does not concern your lines"),
                       ("nimbo://incident?id=x", "“nimbo://incident.id=x” cannot be opened here"),
                       ("nimbo://line?id=town:m3", "Add this line to your favorites"),
                       ("nimbo://line?id=town:m1", "The cows are gone"),
                       ("nimbo://?favorites=2&t=r", "Move 1, Harbour Line down"),
                       (sample_activity_url(os.path.join(folder, "sample")), "Trains every 12 minutes"),
                       ("nimbo://", "Good Service")):
        subprocess.run([desktop, url], check=True, timeout=PATIENCE)
        window.see(sight)

    window.click("1, Harbour Line, 1 incident", "list item")
    window.see_page("1, Harbour Line")
    window.see("The cows are gone")
    for change in "Remove 1, Harbour Line from", "Add 1, Harbour Line to", "Remove 1, Harbour Line from":
        window.see(change)
        window.click(f"{change} favorites")
    press("key", "Escape")
    wait("the line gone from the list", lambda: not window.find("1, Harbour Line, ", "list item"))
    subprocess.run([command_line, "favorite", "add", "town:m1"], check=True)

    with socket.create_server(("127.0.0.1", 0)) as silent:
        subprocess.run([command_line, "feed", "remove", "other"], check=True)
        window.click("Favorites", "list item")
        window.see("Metro, Its feed is not set up any more", "list item")
        press("key", "Escape")
        window.click("Feeds", "list item")
        for mayBeUndone in True, False:
            window.click("^Remove$")
            window.see("Remove with 2 Favorites")
            press("key", "Tab", "Tab", "Return")
            window.see("No feed is set up")
            if mayBeUndone:
                window.click("Undo")
        assert "town" not in subprocess.run([command_line, "favorite", "list"], capture_output=True, text=True).stdout
        window.click("By Address")
        address = f"http://127.0.0.1:{silent.getsockname()[1]}/feed"
        window.fill(("Name", "slow"), ("Lines", address), ("Incidents", address))
        connection = silent.accept()[0]
        connection.sendall(b"HTTP/1.1 200 OK\r\nContent-Length: 12582912\r\n\r\n" + bytes(3 << 20))
        window.see("Reading the feed…\n3 of 12 MiB received")
        press("key", "Escape")
        window.see_page("Nimbo Transit")
        window.quit()


def catalog(session, folder):
    """From nothing to the state of an agency's line, with its name and a key alone."""
    city, asked = os.path.join(folder, "city"), []
    publish(city, ["Signals fail"])
    shutil.copy(pathlib.Path(__file__).parents[3] / "fuzz/seeds/Images/jpeg", city + "/map.png")
    with zipfile.ZipFile(city + "/city.zip", "w") as archive:
        for name in "agency.txt", "routes.txt":
            archive.write(os.path.join(city, name), name)

    class Agency(http.server.BaseHTTPRequestHandler):
        def do_GET(self):
            asked.append((self.path, self.headers.get("X-Key")))
            isLetIn = self.headers.get("X-Key") == "s3cret" or self.path.endswith(".png")
            self.send_response(200 if isLetIn else 401)
            self.end_headers()
            if self.path == "/slow.png":
                self.connection.recv(1)
                asked.append("left")
            elif isLetIn:
                self.wfile.write(pathlib.Path(city + self.path).read_bytes())

        def log_message(self, *arguments):
            pass

    with http.server.ThreadingHTTPServer(("127.0.0.1", 0), Agency) as server:
        threading.Thread(target=server.serve_forever, daemon=True).start()
        address, key = f"http://127.0.0.1:{server.server_port}", {"in": "header", "name": "X-Key", "page": "https://keys.example/"}
        feeds = [{"id": "1", "provider": "Metro", "country": "CH", "municipality": "Zürich",
                  "alerts": {"url": address + "/alerts.pb", "key": key}, "static": [{"url": address + "/city.zip", "key": key}]}]
        data = pathlib.Path(folder, "data/nimbo-transit")
        data.mkdir(parents=True)
        (data / "feed-catalog.json.bz2").write_bytes(bz2.compress(json.dumps({"version": 1, "feeds": feeds}).encode()))
        window = Window(session, desktop, XDG_DATA_HOME=folder + "/data")
        window.comes_to_front()
        window.click("Set Up a Feed")
        window.click("Search agencies", "entry")
        press("type", "atlantis")
        window.see("No agency or place was found")
        window.click("Switzerland, 1 feed")
        window.click("Metro, Zürich, Switzerland", "list item")
        window.see("https://keys.example/")
        press("type", "wrong")
        press("key", "Return")
        window.see("The server wants a valid key. Get one here: https://keys.example/")
        window.fill(("^Key", "s3cret"))
        window.see_page("Favorites")
        window.click("Add 1, Harbour Line to favorites")
        window.see("Remove 1, Harbour Line from favorites")
        press("key", "alt+Left")
        window.click("^Edit$")
        window.see("Edit “metro”")
        window.fill(("Minutes", "0"), ("Copy", address + "/copy.zip"))
        window.see("Enter a number of minutes from 1 to 527040")
        window.fill(("Minutes", "30"))
        wait("the form gone", lambda: not window.find("Edit “metro”"))
        settings = json.loads(pathlib.Path(folder, ".config/nimbo-transit/feeds.json").read_text())["feeds"][0]
        assert settings["maximumAlertsAgeMinutes"] == 30 and settings["staticMirror"].endswith("/copy.zip"), settings
        window.click("^Edit$")
        window.fill(("Lines", city + "/alerts.pb"))
        window.see("is the other half of a feed")
        press("key", "alt+Left")
        window.see("Signals fail", "push button")
        for image in "map.png", "slow.png":
            publish(city, [f"See {image}"], f"{address}/{image}")
            press("key", "F5")
            window.see(f"See {image}", "push button")
            window.click("1, Harbour Line, 1 incident", "list item")
            if image == "map.png":
                wait("the map in sight", lambda: window.box("A map", "image").height == 24)
            window.see("A map", "image" if image == "map.png" else "label")
            press("key", "alt+Left")
        wait("the image given up", lambda: asked[-1] == "left")
        assert ("/map.png", None) in asked, "without a key"
        press("key", "ctrl+question")
        window.see_page("Keyboard Shortcuts")
        window.see("Ctrl.W")
        press("key", "alt+Left")
        press("key", "ctrl+w")
        assert window.process.wait(PATIENCE) == 0
        server.shutdown()
    assert ("/alerts.pb", "s3cret") in asked and ("/city.zip", "wrong") in asked, asked


def size_of(identifier):
    return subprocess.run(["xdotool", "getwindowgeometry", "--shell", identifier], capture_output=True, text=True,
                          check=True).stdout.splitlines()[3:5]


FAULTS = {  # what the widget program does, and what the window says
    "#!/nonexistent": "cannot start .*Install it",
    "#!/bin/sh\nexit 3": "it ended",
    "#!/bin/sh\ncat >/dev/null": 'it does not answer "initialize"',
    "#!/bin/sh\nexec yes '{\"jsonrpc\":\"2.0\",\"method\":\"log\",\"params\":{}}'": "it does not stop talking",
    "#!/bin/sh\nexec yes nonsense": "it speaks nonsense",
    "#!/bin/sh\nexec tr -d '\\n' 3<&0 </dev/zero": "it speaks nonsense",
    '#!/bin/sh\nwhile read -r line; do echo "$line" | sed \'s/.*"id":\\([0-9]*\\).*/{"jsonrpc":"2.0","id":\\1,"result":[7]}/\';'
    " done": "nonsense",
}


def faults(session, folder):
    windows = []
    for number, program in enumerate(FAULTS):
        path = os.path.join(folder, f"widget{number}")
        pathlib.Path(path).write_text(program)
        os.chmod(path, stat.S_IRWXU)
        windows.append(Window(session, desktop, "--state", path + ".state", NIMBO_TRANSIT_WIDGET=path))
    for window, reason in zip(windows, FAULTS.values()):
        window.see("cannot be shown: ")
        window.see(reason)
        window.comes_to_front()
        window.click("Feeds", "list item")
        window.see_page("Feeds")
        window.quit()

    window = Window(session, desktop, "--state", folder + "/german", LANG="en_US.UTF-8", LANGUAGE="pl:de")
    window.comes_to_front()
    window.click("Feed einrichten")
    window.click("Mit Adresse")
    window.click("Hinzufügen")
    window.see("Gib einen Namen")
    for entry, text, problem in (("Name", "town", "Diese Adresse"), ("Linien", "/none", "Diese Adresse"),
                                 ("Störungen", "/nothing", "^/nothing lässt sich nicht lesen")):
        window.fill((entry, text))
        window.see(problem)
    window.see("^/none lässt sich nicht lesen")
    window.quit()

    told, gate = os.path.join(folder, "told"), os.path.join(folder, "gate")
    os.mkfifo(gate)
    path = os.path.join(folder, "listening")
    pathlib.Path(path).write_text(
        f"#!/bin/sh\ntee '{told}' | '{widget}' \"$@\" | {{ read -r go <'{gate}'; cat; }}\n")
    os.chmod(path, stat.S_IRWXU)
    window = Window(session, desktop, "--state", path + ".state", NIMBO_TRANSIT_WIDGET=path)
    identifier = window.comes_to_front()
    size_of_default = size_of(identifier)
    window.click("Menu")
    press("key", "Escape")
    pathlib.Path(gate).write_text("The window has its size before it hears of the widget's.\n")
    window.see("4 Advisories", "push button")
    with open(told) as file:
        sizes = wait("the window's width", lambda: [json.loads(line)["params"]["size"] for line in file
                                                   if "transitionToSize" in line])
    assert all(height == 110 for _, height in sizes), sizes
    for events, method in ((("key", "ctrl+plus"), "setTextSize"), (("key", "F5"), "performUpdate"),
                           (("windowunmap", identifier), "viewDidDisappear"), (("windowmap", identifier), "viewWillAppear"),
                           (("windowsize", identifier, "500", "700"), "transitionToSize")):
        with open(told) as file:
            file.seek(0, os.SEEK_END)
            press(*events)
            wait(f"{method} after {events}", lambda: method in file.read())
    window.comes_to_front()
    window.click("Show More")
    window.see("Show Less")
    kept = size_of(identifier)
    window.quit()
    with sqlite3.connect(path + ".state/state.sqlite") as state:  # as before the first rows
        state.execute("DELETE FROM settings WHERE key = 'Nimbo.TransitWidget.savedUIData'")
    window = Window(session, desktop, "--state", path + ".state", NIMBO_TRANSIT_WIDGET=path)
    pathlib.Path(gate).write_text("\n")
    window.see("Show Less")
    assert size_of(window.comes_to_front()) == kept != size_of_default, (kept, size_of_default)
    window.quit()
    with open(told) as file:
        modes = [line["params"]["mode"] for line in map(json.loads, file) if line.get("method") == "setActiveDisplayMode"]
    assert modes == ["expanded"], modes

    blind = subprocess.run([desktop], env=session.environment | {"DISPLAY": ""}, capture_output=True, text=True)
    assert blind.returncode == 1 and re.search("no display.*nimbo-transit in the terminal", blind.stderr), blind
    for bus in "", "unix:path=/nonexistent":
        window = Window(session, desktop, DBUS_SESSION_BUS_ADDRESS=bus, GTK_A11Y="none")
        window.comes_to_front()
        wait("the widget process", window.children)
        window.quit()


def bus(session, folder):
    """The bus starts the window: for the desktop's search, and for an address."""
    name, city, state = "org.nimbo.Transit", os.path.join(folder, "city"), folder + "/.local/state/nimbo-transit/state.sqlite"
    services = pathlib.Path(folder, "dbus-1/services")  # of this session alone
    service = pathlib.Path(desktop).parents[3].joinpath("data", name + ".service").read_text()
    services.joinpath(name + ".service").write_text(re.sub("(?m)^Exec=/.*/nimbo-transit-desktop ", f"Exec={desktop} ", service))
    provider = configparser.ConfigParser()
    assert provider.read(pathlib.Path(__file__).parents[3] / "data" / (name + ".search-provider.ini"))
    provider = provider["Shell Search Provider"]
    assert (provider["DesktopId"], provider["Version"]) == (name + ".desktop", "2")
    connection = Gio.bus_get_sync(Gio.BusType.SESSION)

    def call(destination, path, interface, method, signature, *arguments):
        return connection.call_sync(destination, path, interface, method, GLib.Variant(signature, arguments), None,
                                    Gio.DBusCallFlags.NONE, PATIENCE * 1000, None).unpack()

    def search(method, signature, *arguments):
        return call(provider["BusName"], provider["ObjectPath"], "org.gnome.Shell.SearchProvider2", method, signature, *arguments)

    def states():
        metas, = search("GetResultMetas", "(as)", ["town:m2", "town:m1", "town:none"])
        assert [(meta["id"], meta["name"], meta["gicon"]) for meta in metas] == [
            ("town:m2", "2, Castle Line", name), ("town:m1", "1, Harbour Line", name)], metas
        return " / ".join(meta["description"].removeprefix("Metro · ") for meta in metas)

    def keep(change):
        with sqlite3.connect(state) as database:
            where = "WHERE key = 'Nimbo.TransitWidget.savedLines'"
            kept = json.loads(database.execute(f"SELECT value FROM settings {where}").fetchone()[0])
            database.execute(f"UPDATE settings SET value = ? {where}", [change(kept)])

    def window():
        found = Window.__new__(Window)
        pid, = call("org.freedesktop.DBus", "/", "org.freedesktop.DBus", "GetConnectionUnixProcessID", "(s)", name)
        found.process = types.SimpleNamespace(pid=pid)
        return found

    def open_by_bus(url):
        call(name, "/org/nimbo/Transit", "org.freedesktop.Application", "Open", "(asa{sv})", [url], {})

    def at(seconds):
        return time.strftime("%Y-%m-%dT%H:%M:%SZ", time.gmtime(time.time() + seconds))

    call("org.freedesktop.DBus", "/", "org.freedesktop.DBus", "ReloadConfig", "()")
    assert search("GetInitialResultSet", "(as)", ["line"]) == ([],)  # of the sample city
    publish(city, ["Signals fail"])
    for arguments in (["feed", "add", "town", "--static", city, "--alerts", city + "/alerts.pb"],
                      ["favorite", "add", "town:m1", "town:m2"]):
        subprocess.run([command_line, *arguments], check=True, capture_output=True)
    for words, lines in ((["castle"], ["town:m2"]), (["MÉTRO", "harb"], ["town:m1"]),
                         (["town:m"], ["town:m1", "town:m2"]), (["castle", "harbour"], [])):
        assert search("GetInitialResultSet", "(as)", words) == (lines,), words
        assert search("GetSubsearchResultSet", "(asas)", ["town:m1"], words) == (lines,), words
    assert states().startswith("Not known: "), states()  # never looked up
    subprocess.run([command_line, "update"], check=True)
    assert states() == "Good Service / 1 incident", states()

    for change, told in (
            (lambda kept: kept | {"updated": at(-3600)}, "Not known any more; last looked up .* / 1 incident · Updated "),
            (lambda kept: kept | {"updated": at(3600)}, "Not known any more; .* / 1 incident · Updated "),
            (lambda kept: kept | {"updated": None}, "Not known: .* / Not known: "),
            (lambda kept: kept["lines"][0]["incidents"][0].update(until=at(-60)), "Good Service / Not known any more"),
            (lambda kept: kept["lines"][1]["planned"].append(kept["lines"][0]["incidents"][0] | {"from": at(-60)}),
             "1 incident / 1 incident"),
            (lambda kept: kept["lines"].remove(kept["lines"][1]), "Not known: .* / 1 incident"),
            (lambda kept: kept.clear(), "Not known: .* / Not known: ")):
        subprocess.run([command_line, "update"], check=True)
        keep(lambda kept: json.dumps(change(kept) or kept))
        assert re.match(told, states()), (told, states())
    os.remove(city + "/alerts.pb")
    assert subprocess.run([command_line, "update"], capture_output=True).returncode == 1
    assert re.match("Not known: .* / Not known: ", states()), states()

    publish(city, ["Signals fail"])
    search("ActivateResult", "(sasu)", "town:m1", ["harbour"], 0)
    window().see_page("1, Harbour Line")
    window().see("Signals fail")
    search("LaunchSearch", "(asu)", ["castle", "line"], 0)
    window().see_page("Favorites")
    wait("one line found", lambda: [node.get_name() for node in window().nodes() if node.get_role_name() == "list item"]
         == ["2, Castle Line, Metro"])
    first = window()
    first.comes_to_front()
    press("key", "ctrl+w")  # the service stays
    wait("no window", lambda: not first.frame())
    open_by_bus("nimbo://line?id=town:m2")
    window().see_page("2, Castle Line")
    assert window().process == first.process
    window().comes_to_front()
    press("key", "ctrl+q")
    wait("the end", lambda: call("org.freedesktop.DBus", "/", "org.freedesktop.DBus", "NameHasOwner", "(s)", name) == (False,))
    status = json.loads(subprocess.run([command_line, "status", "--format", "json"], capture_output=True, check=True).stdout)
    open_by_bus("nimbo://incident?id=" + status["lines"][0]["incidents"][0]["id"])
    window().see_page("Incidents")
    window().see("Signals fail")


# The portal that the toolkit asks for mounts a folder there, and ends after the bus.
with tempfile.TemporaryDirectory(ignore_cleanup_errors=True) as home, Session(home) as running:
    {"tour": tour, "faults": faults, "catalog": catalog, "bus": bus}[sys.argv[1]](running, home)
