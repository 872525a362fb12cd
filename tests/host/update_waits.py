#!/usr/bin/python3
"""What "update" does while static feeds are still coming, with this file as its widget.
usage: update_waits.py NIMBO_TRANSIT"""
import json
import os
import subprocess
import sys
import tempfile

# What the widget answers to the first and the later requests of a method.
ANSWERS = {
    "performUpdate": [{"updateResult": "failed", "reason": "12 MiB have come.", "downloading": True},
                      {"updateResult": "newData"}],
    "downloads": [{"downloads": [{"feed": "metro", "received": 1}]}, {"downloads": []}],
    "initialize": [{"name": "widget", "version": "1", "protocol": 1}],
}

if sys.argv[1] == "--widget":
    asked = {}
    for line in sys.stdin:
        request = json.loads(line)
        method = request["method"]
        answers = ANSWERS.get(method, [{}])
        result = answers[min(asked.get(method, 0), len(answers) - 1)]
        asked[method] = asked.get(method, 0) + 1
        if method == "shutdown":
            print(json.dumps(asked), file=sys.stderr)
        print(json.dumps({"jsonrpc": "2.0", "id": request["id"], "result": result}), flush=True)
    sys.exit()

with tempfile.TemporaryDirectory() as folder:
    widget = os.path.join(folder, "widget")
    with open(widget, "w") as file:
        file.write(f"#!/bin/sh\nexec /usr/bin/python3 '{__file__}' --widget\n")
    os.chmod(widget, 0o700)
    waited = subprocess.run([sys.argv[1], "--config", folder, "--state", folder, "update"], capture_output=True,
                            text=True, env=dict(os.environ, NIMBO_TRANSIT_WIDGET=widget))
    assert waited.returncode == 0, waited
    *messages, asked = waited.stderr.splitlines()
    assert messages == ["nimbo-transit: 12 MiB have come.",
                        'nimbo-transit: waiting for the static feed of "metro"'], messages
    asked = json.loads(asked)
    assert asked["performUpdate"] == 2 and asked["downloads"] == 2, asked
