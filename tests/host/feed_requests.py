#!/usr/bin/python3
"""What hosts ask of feeds while a server does not finish: feed_requests.py NIMBO_TRANSIT NIMBO_TRANSIT_WIDGET"""

import json
import os
import pathlib
import pty
import socket
import subprocess
import sys
import tempfile
import threading

from cities import publish
from city import Widget

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


def hear(widget, wanted):
    """The next message that is wanted."""
    return next(message for message in map(json.loads, widget.process.stdout) if wanted(message))


def answer(widget, identifier):
    return hear(widget, lambda message: message.get("id") == identifier)


def check_requests(folder, address):
    asked = Widget([widget, "--config", folder, "--state", folder])
    check = ("checkFeed", {"definition": {"name": "slow", "static": address, "alerts": address}})
    asked.send(check, ("findLines", {"query": "", "limit": 1}))
    assert answer(asked, 2)["result"]["total"] == 12, "answered before the one that waits"
    privileges = open(f"/proc/{asked.process.pid}/status").read()
    assert "NoNewPrivs:\t1" in privileges and "Seccomp:\t2" in privileges, "given up before it speaks"
    progress = hear(asked, lambda message: message.get("method") == "progress"
                    and message["params"]["received"] == len(PIECE))["params"]
    assert progress == {"request": 1, "feed": "slow", "part": "static", "received": len(PIECE), "length": 99999999,
                        "done": 0, "total": 1}, progress
    asked.send(("cancel", {"request": 1}))
    assert answer(asked, 1)["error"]["code"] == -32004
    assert answer(asked, 3)["result"] == {}
    assert asked.close() == 0

    asked = Widget([widget, "--config", folder, "--state", folder])
    asked.send(*[check] * 17)
    assert answer(asked, 17)["error"]["code"] == -32001
    asked.send("initialize")
    assert sorted(answer(asked, number)["error"]["code"] for number in range(1, 17)) == [-32004] * 16
    assert "result" in answer(asked, 18)
    asked.send(check)
    assert asked.close() == 0


def check_terminal(folder, address):
    feed = folder / "feed"
    publish(feed, [])
    (folder / "feeds.json").write_text(json.dumps({"feeds": [
        {"name": "near", "static": str(feed), "alerts": "/none"}, {"name": "far", "static": address, "alerts": "/none"}]}))
    controller, terminal = pty.openpty()
    run = subprocess.Popen([command_line, "--config", folder, "--state", folder, "lines"], stderr=terminal,
                           stdout=subprocess.PIPE, text=True)
    os.close(terminal)
    shown = ""
    while "\r\x1b[KReading the lines of far, feed 2 of 2: 3 of 95 MiB have come" not in shown:
        shown += os.read(controller, 4096).decode()
    for connection in connections:
        connection.close()
    assert run.wait(60) == 1
    assert "near:m1" in run.stdout.read()
    try:
        while piece := os.read(controller, 4096):
            shown += piece.decode()
    except OSError:
        pass  # nobody has the terminal any more
    assert "\r\x1b[Knimbo-transit: " in shown, shown


with tempfile.TemporaryDirectory() as name, socket.create_server(("127.0.0.1", 0)) as listening:
    connections = []
    threading.Thread(target=serve, args=[listening], daemon=True).start()
    url = f"http://127.0.0.1:{listening.getsockname()[1]}/feed.zip"
    for check in check_requests, check_terminal:
        place = pathlib.Path(name) / check.__name__
        place.mkdir()
        check(place, url)
