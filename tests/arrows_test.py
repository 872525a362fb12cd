#!/usr/bin/python3
"""Breaks arrows between folders, and sees the check refuse each: arrows_test.py CHECKOUT"""
import pathlib
import shutil
import subprocess
import sys
import tempfile

checkout = pathlib.Path(sys.argv[1])
BROKEN = {  # what is added to which file, and what the check says
    "src/host/main.cpp": ('#include "widget/NBTransitIncidentsViewController.h"\n',
                          "src/host/main.cpp includes widget/NBTransitIncidentsViewController.h"),
    "src/platform/foundation/Log.cpp": ('#include "platform/Platform.h"\n',
                                        "src/platform/foundation/Log.cpp includes platform/Platform.h"),
    "docs/architecture.md": ("| `protocol` | `desktop` |\n", "nothing in src/protocol includes desktop"),
}


def check(folder):
    return subprocess.run([sys.executable, checkout / "tools/arrows.py", folder], capture_output=True, text=True)


with tempfile.TemporaryDirectory() as name:
    folder = pathlib.Path(name)
    for part in "src", "docs":
        shutil.copytree(checkout / part, folder / part)
    result = check(folder)
    assert result.returncode == 0, result.stderr
    for file, (line, says) in BROKEN.items():
        content = (folder / file).read_text()
        (folder / file).write_text(content + line)
        result = check(folder)
        assert result.returncode == 1 and says in result.stderr, (file, result)
        (folder / file).write_text(content)
