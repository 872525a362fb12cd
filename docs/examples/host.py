#!/usr/bin/python3
"""A host of the transit widget: shows its rows, opens the first one, and takes its leave.
usage: host.py [WIDGET [ARGUMENTS OF THE WIDGET...]]"""
import json
import os
import subprocess
import sys


class Widget:
    def __init__(self, command):
        # Room for the largest picture; the memory is taken as it is drawn into.
        self.pictures = os.memfd_create("pictures")
        os.ftruncate(self.pictures, 256_000_000)
        self.process = subprocess.Popen([*command, "--pictures", str(self.pictures)], pass_fds=[self.pictures],
                                        stdin=subprocess.PIPE, stdout=subprocess.PIPE, encoding="utf-8")
        self.last_id = 0

    def send(self, message):
        self.process.stdin.write(json.dumps({"jsonrpc": "2.0", **message}) + "\n")
        self.process.stdin.flush()

    def call(self, method, **params):
        """Asks, and serves the widget's own messages until the answer comes."""
        self.last_id += 1
        self.send({"id": self.last_id, "method": method, "params": params})
        for line in self.process.stdout:
            message = json.loads(line)
            if "method" in message:
                self.serve(message)
            elif message.get("id") == self.last_id:
                if "error" in message:
                    raise RuntimeError(f"{method}: {message['error']['message']}")
                return message["result"]
        raise RuntimeError(f"the widget ended with status {self.process.wait()} before it answered {method}")

    def serve(self, message):
        if message["method"] in ("openURL", "openUserActivity"):
            print("Open", message["params"].get("url") or message["params"]["activityType"])
            self.send({"id": message["id"], "result": {"opened": True}})
        elif message["method"] == "notice":
            print("Note:", message["params"]["message"], file=sys.stderr)


widget = Widget(sys.argv[1:] or ["nimbo-transit-widget"])
widget.call("initialize", locale="en", displayModes={"compact": [359, 110], "expanded": [359, 440]},
            bundle={"kind": "application", "identifier": "org.example.Host"})
for step in ("loadView", "viewWillAppear", "viewDidAppear", "performUpdate"):
    widget.call(step)
for row in widget.call("snapshot")["rows"]:
    print(row["primaryText"], "-", row.get("secondaryText") or "")
widget.call("selectRow", section=0, row=0)
drawn = widget.call("render")
blue, green, red, _ = os.pread(widget.pictures, 4, 0)
print(f"A picture of {drawn['width']} by {drawn['height']} pixels, the first is #{red:02x}{green:02x}{blue:02x}")
for step in ("viewWillDisappear", "viewDidDisappear", "shutdown"):
    widget.call(step)
print("The widget ended with status", widget.process.wait())
