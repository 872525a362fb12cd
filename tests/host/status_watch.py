#!/usr/bin/python3
"""Follows the sample city with "status --waybar --watch" through a widget whose time this test moves; then what other
programs change meanwhile. usage: status_watch.py NIMBO_TRANSIT WIDGET"""
import json
import os
import signal
import socket
import subprocess
import sys
import tempfile
import threading

from cities import publish

program, widget = sys.argv[1:3]


def play_widget(arguments):
    """The widget with its host's messages and, from a FIFO, with seconds to advance."""
    process = subprocess.Popen([widget, *arguments, "--virtual-time", "2026-01-05T12:00:00Z"],
                               stdin=subprocess.PIPE, stdout=subprocess.PIPE, bufsize=0)

    def advance():
        with open(os.environ["TEST_ADVANCES"], "rb", buffering=0) as advances:
            for line in advances:
                process.stdin.write(b'{"jsonrpc":"2.0","id":"t","method":"advanceTime","params":{"seconds":%d}}\n'
                                    % int(line))

    def answer():
        for line in process.stdout:
            if json.loads(line).get("id") != "t":
                os.write(1, line)

    for work in (advance, answer):
        threading.Thread(target=work, daemon=True).start()
    for line in sys.stdin.buffer:
        process.stdin.write(line)
    process.stdin.close()
    process.wait()
    os._exit(0)


if len(sys.argv) > 3:
    play_widget(sys.argv[4:])

with tempfile.TemporaryDirectory() as folder:
    fifo, script = os.path.join(folder, "advances"), os.path.join(folder, "widget")
    os.mkfifo(fifo)
    with open(script, "w") as file:
        file.write(f'#!/bin/sh\nexec /usr/bin/python3 {__file__} {program} {widget} -- "$@"\n')
    os.chmod(script, 0o700)
    command = [program, "--config", folder, "--state", folder]

    def watch(output=subprocess.PIPE):
        return subprocess.Popen(command + ["status", "--waybar", "--watch"], stdout=output,
                                env=dict(os.environ, NIMBO_TRANSIT_WIDGET=script, TEST_ADVANCES=fifo, LC_ALL="C.UTF-8"))

    bar = watch()
    first = json.loads(bar.stdout.readline())
    # The machine's clock is far ahead of the widget's.
    assert first["class"] == ["advisories", "new", "stale"] and first["alt"] == "advisories" and "Weavers&apos; Row" in first["tooltip"], first
    with open(fifo, "wb", buffering=0) as advances:
        for seconds in (b"5400\n", b"1800\n"):  # an incident ends, and another one starts or ends
            before = first
            advances.write(seconds)
            first = json.loads(bar.stdout.readline())
            assert first != before and set(first) == {"text", "alt", "tooltip", "class", "percentage"}, first
        bar.send_signal(signal.SIGTERM)
        rest = bar.stdout.read()
        assert bar.wait() == 0 and b"error" not in rest, rest

    bar = watch()
    with open(fifo, "wb"):
        first = json.loads(bar.stdout.readline())
        assert first["class"][::len(first["class"]) - 1] == ["old", "stale"] and first["alt"] == "old" and first["text"].endswith("(old)"), first
        bar.stdout.close()
        assert bar.wait() == 0, "a bar without a reader ends by itself"
    ours, theirs = socket.socketpair()
    bar = watch(theirs)
    theirs.close()
    with open(fifo, "wb"):
        assert ours.recv(1)
        ours.close()
        assert bar.wait() == 0, "so does one whose reader held a socket"

# A widget program that is not there is tried again, and what other processes change shows at once: nothing else would
# make a bar look again before a minute has passed.
with tempfile.TemporaryDirectory() as folder:
    command = [program, "--config", folder, "--state", folder]
    feed, late = os.path.join(folder, "feed"), os.path.join(folder, "widget")
    bar = subprocess.Popen(command + ["status", "--waybar", "--watch"], stdout=subprocess.PIPE,
                           env=dict(os.environ, NIMBO_TRANSIT_WIDGET=late))

    def see(state):
        signal.alarm(60)  # rather than to wait for ever
        while json.loads(bar.stdout.readline())["alt"] != state:
            pass

    see("error")
    os.symlink(widget, late)
    see("advisories")
    publish(feed, [])
    alerts = feed + "/late.pb"
    for arguments, state in ((["feed", "add", "city", "--static", feed, "--alerts", alerts, "--force"], "none"),
                             (["favorite", "add", "city:m1"], "error")):
        subprocess.run(command + arguments, check=True, capture_output=True)
        see(state)
    os.rename(feed + "/alerts.pb", alerts)
    see("good")
    bar.send_signal(signal.SIGTERM)
    assert bar.wait() == 0
print("watched")
