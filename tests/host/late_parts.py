"""Installed programs open their parts late, and say which file is missing: late_parts.py CMAKE BUILD"""

import os
import pathlib
import re
import subprocess
import sys
import tempfile

from cities import publish

LIBRARIES = re.compile(r"calling init: \S*(libnimbo-|libcurl|libzip|libicu|libpango|libcairo|libgio)")


def main(cmake, build):
    folder = pathlib.Path(tempfile.mkdtemp())
    subprocess.run([cmake, "--install", build, "--prefix", folder], check=True, stdout=subprocess.DEVNULL)
    program = folder / "bin/nimbo-transit"
    parts = {path.name: path for path in folder.glob("**/libnimbo-*.so")}

    def run(*arguments, **environment):
        command = [program, "--config", folder / "config", "--state", folder / "state", *arguments]
        return subprocess.run(command, capture_output=True, text=True, env=dict(os.environ, **environment))

    def without(part, *arguments):
        away = parts[part].with_suffix(".away")
        parts[part].rename(away)
        result = run(*arguments)
        away.rename(parts[part])
        assert part in result.stdout + result.stderr, f"without {part}: {result}"
        return result

    def loaded(*arguments):
        """What nimbo-transit loads itself: the widget process that it may start writes a file of its own."""
        with tempfile.TemporaryDirectory() as logs:
            host = subprocess.Popen([program, "--config", folder / "config", "--state", folder / "state", *arguments],
                                    stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL,
                                    env=dict(os.environ, LD_DEBUG="files", LD_DEBUG_OUTPUT=logs + "/log"))
            host.wait()
            return LIBRARIES.findall(pathlib.Path(f"{logs}/log.{host.pid}").read_text())

    for arguments in ["favorite", "list"], ["lines", "red"], ["settings", "get", "x"], ["feed", "check"]:
        assert not loaded(*arguments), f"{arguments} loads {loaded(*arguments)}"
    for arguments in ["--waybar"], [], ["--saved"]:
        status = run("status", *arguments, LD_DEBUG="files")  # of both processes
        assert "4 Advisories" in status.stdout
        needless = {"libpango", "libcairo", "libicu", "libgio"}.intersection(LIBRARIES.findall(status.stderr))
        assert not needless, f"status {arguments} loads {needless}"
        assert "libnimbo-images" not in status.stderr
    assert without("libnimbo-drawing.so", "status", "--json").returncode != 0
    without("libnimbo-strings.so", "feed", "find", "metro")

    feed = folder / "feed"
    publish(feed, [])
    run("feed", "add", "city", "--static", feed, "--alerts", "http://127.0.0.1:1/alerts.pb", "--force")
    run("favorite", "add", "city:m1")
    for arguments in ["feed", "check"], ["lines", "harbour"], ["favorite", "remove", "city:m1"], ["favorite", "add", "city:m1"]:
        assert not loaded(*arguments), f"{arguments} loads {loaded(*arguments)}"
    assert "city:m1" in run("favorite", "list", NIMBO_TRANSIT_WIDGET="/none").stdout, "asks no feed"
    without("libnimbo-feeds.so", "status", "--json")


main(*sys.argv[1:])
