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


def watch(folder, by=widget, output=subprocess.PIPE):
    return subprocess.Popen([program, "--config", folder, "--state", folder, "status", "--waybar", "--watch"], stdout=output,
                            env=dict(os.environ, NIMBO_TRANSIT_WIDGET=by, TEST_ADVANCES=f"{folder}/advances", LC_ALL="C.UTF-8"))


def see(bar, **wanted):
    """The next line that holds what is wanted; those before are passed over."""
    signal.alarm(60)  # rather than to wait for ever
    line = {}
    while any(line.get(key) != value for key, value in wanted.items()):
        line = json.loads(bar.stdout.readline())
    return line


def end(bar):
    bar.send_signal(signal.SIGTERM)
    rest = bar.stdout.read()
    assert bar.wait() == 0 and b"error" not in rest, rest


with tempfile.TemporaryDirectory() as folder:
    script = os.path.join(folder, "widget")
    os.mkfifo(f"{folder}/advances")
    with open(script, "w") as file:
        file.write(f'#!/bin/sh\nexec /usr/bin/python3 {__file__} {program} {widget} -- "$@"\n')
    os.chmod(script, 0o700)

    bar = watch(folder, script)
    # The machine's clock is far ahead of the widget's.
    first = see(bar, **{"class": ["advisories", "new", "stale"]})
    assert first["alt"] == "advisories" and "Weavers&apos; Row" in first["tooltip"], first
    with open(f"{folder}/advances", "wb", buffering=0) as advances:
        for seconds in (b"5400\n", b"1800\n"):  # an incident ends, and another one starts or ends
            before = first
            advances.write(seconds)
            first = json.loads(bar.stdout.readline())
            assert first != before and set(first) == {"text", "alt", "tooltip", "class", "percentage"}, first
        end(bar)

    bar = watch(folder)
    first = json.loads(bar.stdout.readline())
    assert first["class"][::len(first["class"]) - 1] == ["old", "stale"] and first["alt"] == "old" and first["text"].endswith("(old)"), first
    bar.stdout.close()
    assert bar.wait() == 0, "a bar without a reader ends by itself"
    ours, theirs = socket.socketpair()
    bar = watch(folder, output=theirs)
    theirs.close()
    assert ours.recv(1)
    ours.close()
    assert bar.wait() == 0, "so does one whose reader held a socket"

# A widget program that is not there is tried again, and what other processes change shows at once: nothing else would
# make a bar look again before a minute has passed.
with tempfile.TemporaryDirectory() as folder:
    feed, alerts, late = f"{folder}/feed", f"{folder}/feed/late.pb", f"{folder}/widget"
    bar = watch(folder, late)
    see(bar, alt="error")
    os.symlink(widget, late)
    see(bar, alt="advisories")
    publish(feed, [])
    for arguments, state in ((["feed", "add", "city", "--static", feed, "--alerts", alerts, "--force"], "none"),
                             (["favorite", "add", "city:m1"], "error")):
        subprocess.run([program, "--config", folder, "--state", folder, *arguments], check=True, capture_output=True)
        see(bar, alt=state)
    os.rename(feed + "/alerts.pb", alerts)
    see(bar, alt="good")
    end(bar)
print("watched")
