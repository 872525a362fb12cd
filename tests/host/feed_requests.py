#!/usr/bin/python3
"""What hosts ask of feeds while a server does not finish: feed_requests.py NIMBO_TRANSIT NIMBO_TRANSIT_WIDGET"""

import http.server
import io
import json
import os
import pathlib
import pty
import re
import socket
import subprocess
import sys
import tempfile
import threading
import zipfile

command_line, widget = sys.argv[1:]
PIECE = b"P" * (3 << 20)


def serve(server):
    """Answers every request with the beginning of a long document, and goes no further."""
    while True:
        try:
            connection = server.accept()[0]
        except OSError:
            return
        connections.append(connection)
        try:
            connection.recv(65536)
            connection.sendall(b"HTTP/1.1 200 OK\r\nContent-Length: 99999999\r\n\r\n" + PIECE)
        except OSError:
            pass  # nobody wants it any more


class Widget:
    def __init__(self, folder):
        self.process = subprocess.Popen([widget, "--config", folder, "--state", folder], stdin=subprocess.PIPE,
                                        stdout=subprocess.PIPE, text=True)

    def ask(self, identifier, method, **params):
        self.process.stdin.write(json.dumps({"jsonrpc": "2.0", "id": identifier, "method": method,
                                             "params": params}) + "\n")
        self.process.stdin.flush()

    def hear(self, wanted):
        """The next message that is wanted."""
        for line in self.process.stdout:
            if wanted(message := json.loads(line)):
                return message
        raise AssertionError("the widget ended")

    def answer(self, identifier):
        return self.hear(lambda message: message.get("id") == identifier)


def check_requests(folder, address):
    asked = Widget(folder)
    definition = {"name": "slow", "static": address, "alerts": address}
    asked.ask("a", "checkFeed", definition=definition)
    asked.ask(2, "findLines", query="", limit=1)
    assert asked.answer(2)["result"]["total"] == 12, "answered before the one that waits"
    progress = asked.hear(lambda message: message.get("method") == "progress"
                          and message["params"]["received"] == len(PIECE))["params"]
    assert progress == {"request": "a", "feed": "slow", "part": "static", "received": len(PIECE), "length": 99999999,
                        "done": 0, "total": 1}, progress
    asked.ask(3, "cancel", request="a")
    assert asked.answer("a")["error"]["code"] == -32004
    assert asked.answer(3)["result"] == {}
    asked.process.stdin.close()
    assert asked.process.wait(20) == 0

    asked = Widget(folder)
    for number in range(10, 26):
        asked.ask(number, "checkFeed", definition=definition)
    asked.ask(26, "checkFeed", definition=definition)
    assert asked.answer(26)["error"]["code"] == -32001
    asked.ask(27, "initialize")
    assert sorted(asked.answer(number)["error"]["code"] for number in range(10, 26)) == [-32004] * 16
    assert "result" in asked.answer(27)
    asked.ask(28, "checkFeed", definition=definition)
    asked.process.stdin.close()
    assert asked.process.wait(20) == 0


def check_terminal(folder, address):
    feed = folder / "feed"
    feed.mkdir()
    (feed / "routes.txt").write_text("route_id,route_short_name,route_type\nR,1,3\n")
    (folder / "feeds.json").write_text(json.dumps({"feeds": [
        {"name": "near", "static": str(feed), "alerts": "/none"}, {"name": "far", "static": address, "alerts": "/none"}]}))
    controller, terminal = pty.openpty()
    run = subprocess.Popen([command_line, "--config", folder, "--state", folder, "lines"], stderr=terminal,
                           stdout=subprocess.PIPE, text=True)
    os.close(terminal)
    shown = ""
    while "3 of 95 MiB have come" not in shown:
        shown += os.read(controller, 4096).decode()
    assert re.search("\r\x1b\\[KReading the lines of far, feed 2 of 2: 3 of 95 MiB have come", shown), shown
    for connection in connections:
        connection.close()
    assert run.wait(60) == 1
    assert "near:R" in run.stdout.read()
    try:
        while piece := os.read(controller, 4096):
            shown += piece.decode()
    except OSError:
        pass  # nobody has the terminal any more
    assert "\r\x1b[Knimbo-transit: " in shown, shown


def check_cache(folder, _):
    """A server that is down costs nothing of what was here."""
    archive = io.BytesIO()
    with zipfile.ZipFile(archive, "w") as files:
        files.writestr("routes.txt", "route_id,route_short_name,route_type\nR,1,3\n")

    class Zip(http.server.BaseHTTPRequestHandler):
        def do_GET(self):
            self.send_response(200)
            self.end_headers()
            self.wfile.write(archive.getvalue())

        def log_message(self, *_):
            pass

    def run(*arguments, **environment):
        return subprocess.run([command_line, "--config", folder, "--state", folder, *arguments], capture_output=True,
                              text=True, env=os.environ | environment)

    with http.server.HTTPServer(("127.0.0.1", 0), Zip) as server:
        threading.Thread(target=server.serve_forever, daemon=True).start()
        added = run("feed", "add", "city", "--static", f"http://127.0.0.1:{server.server_port}/", "--alerts", "/none",
                    "--force")
        assert added.returncode == 0 and "/none" in added.stderr, added
        server.shutdown()
    for arguments in ["lines", "1"], ["favorite", "add", "city:R"], ["favorite", "list"]:
        done = run(*arguments)
        assert done.returncode == 0 and not done.stderr, done
        assert arguments[1] == "add" or "city:R" in done.stdout, done
    assert "city:R" in run("favorite", "list", NIMBO_TRANSIT_WIDGET="/none").stdout, "asks no feed"
    assert run("feed", "check").returncode == 1


with tempfile.TemporaryDirectory() as name, socket.create_server(("127.0.0.1", 0)) as listening:
    connections = []
    threading.Thread(target=serve, args=[listening], daemon=True).start()
    url = f"http://127.0.0.1:{listening.getsockname()[1]}/feed.zip"
    for check in check_requests, check_terminal, check_cache:
        place = pathlib.Path(name) / check.__name__
        place.mkdir()
        check(place, url)
    listening.close()
