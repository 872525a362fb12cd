#!/usr/bin/python3
"""Taps rows of the sample city and reads what is handed over with decoders that are not this project's: Python's bz2,
and protoc on the published schema. usage: handoff_end_to_end.py NIMBO_TRANSIT SCHEMA"""
import base64
import bz2
import json
import os
import subprocess
import sys
import tempfile

program, schema = sys.argv[1:]
now = "2026-01-05T12:00:00Z"


def request(identifier, method, **params):
    return json.dumps({"jsonrpc": "2.0", "id": identifier, "method": method, "params": params})


script = [
    request(1, "initialize", locale="en", displayModes={"compact": [359, 110], "expanded": [359, 440]},
            bundle={"kind": "application", "identifier": "org.example.Host"}),
    request(2, "loadView"), request(3, "viewWillAppear"), request(4, "viewDidAppear"), request(5, "performUpdate"),
    request(6, "selectRow", section=0, row=0),  # the summary: a list of incidents
    request(7, "setActiveDisplayMode", mode="expanded"),
    request(8, "snapshot"),
] + [request(10 + row, "selectRow", section=0, row=row) for row in range(4)] + [request(20, "shutdown")]

with tempfile.TemporaryDirectory() as folder:
    result = subprocess.run([program, "--config", folder, "--state", folder, "script", "--virtual-time", now, "-"],
                            input="\n".join(script), capture_output=True, text=True)
    assert result.returncode == 0, result.stderr
    lines = [json.loads(line) for line in result.stdout.splitlines()]
    opened = [line["params"] for line in lines if line.get("method") in ("openURL", "openUserActivity")]
    rows = next(line["result"]["rows"] for line in lines if line.get("id") == 8 and "result" in line)
    assert len(opened) == 5, f"the summary and four rows open something, not {len(opened)}"

    summary, incident, second, overflow, clear = opened
    assert clear["url"].startswith("nimbo://?favorites=2&t=r&session="), clear
    assert incident["application"] == "org.example.Host", incident
    for activity in (summary, overflow):
        assert activity["activityType"].endswith(".Transit.IncidentList")
        payload = base64.b64decode(activity["userInfo"]["incidentListKey"])
        path = os.path.join(folder, "payload")
        with open(path, "wb") as file:
            file.write(payload)
        decoded = subprocess.run([program, "decode", path], capture_output=True, text=True)
        assert decoded.returncode == 0, decoded.stderr
        json.loads(decoded.stdout)
    for activity, row in ((incident, rows[0]), (second, rows[1])):
        assert activity["activityType"].endswith(".Transit.Incident")
        record = bz2.decompress(base64.b64decode(activity["userInfo"]["bs"]))
        text = subprocess.run(["protoc", f"--proto_path={os.path.dirname(schema)}", "--decode=nimbo.proto.NimboActivity",
                               os.path.basename(schema)], input=record, capture_output=True, check=True).stdout.decode()
        assert "mapType: 3" in text, text
        assert row["primaryText"] in text, (row["primaryText"], text)
print("handed over, and read by others")
