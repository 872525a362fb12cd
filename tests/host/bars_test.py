#!/usr/bin/python3
"""A status bar as its users have it: what swaybar shows of the widget is what it shows, on its other side, of lines that
stand in a file. usage: bars_test.py NIMBO_TRANSIT WIDGET"""
import json
import os
import signal
import subprocess
import sys

from sway_session import LEFT, MIDDLE, RIGHT, Home, Pointer, Program, wait

WIDTH, HEIGHT, BAR = 800, 600, 30
program, widget = sys.argv[1:]


def run(*command):
    return subprocess.run(command, env=session.environment, capture_output=True, text=True).stdout


def watching():
    """Identifiers of the processes that the bar has started for the status."""
    return run("pgrep", "-f", f"^{' '.join(command)} status").split()


def shows(text, **others):
    """Waits until the bar shows the same on both sides, which is not nothing."""
    expected.write(json.dumps([{"full_text": text, **others}]) + ",\n")

    def is_alike():
        pixels = session.picture("HEADLESS-1")[2]
        top, rest, bottom = (pixels[3 * WIDTH * at:][:3 * WIDTH * BAR] for at in (0, BAR, HEIGHT - BAR))
        return top == bottom != rest and len({top[i:i + 3] for i in range(0, len(top), 3)}) > 8
    wait(text, is_alike)


def click(x, y, button=LEFT):
    pointer.click(x, y, WIDTH, HEIGHT, button)


with Home(widget) as session:
    command = [program, "--config", session.folder, "--state", session.folder]
    expected = session.enter_context(open(f"{session.folder}/expected", "w", buffering=1))
    expected.write('{"version":1}\n[\n')
    side = "bar {{\nid {}\nposition {}\nstatus_command {}\nswaybar_command true\nheight {}\nworkspace_buttons no\n}}"
    session.sway(f"output HEADLESS-1 resolution {WIDTH}x{HEIGHT} position 0 0 scale 1 bg #336699 solid_color",
                 side.format("shown", "top", " ".join([*command, "status --format i3bar --watch"]), BAR),
                 side.format("expected", "bottom", f"tail -n +1 -f {expected.name}", BAR))
    pointer = Pointer(f"{session.folder}/wayland-1")
    bars = [Program(session, "swaybar", "-b", name) for name in ("shown", "expected")]
    shows("● 4 Advisories", color="#ffb000", urgent=True)

    for button, page in ((LEFT, "nimbo://"), (RIGHT, "nimbo://planned")):
        click(WIDTH - 40, BAR // 2, button)
        session.opened(f"--state .* -- {page}\n")
    click(WIDTH - 40, BAR // 2, MIDDLE)
    click(WIDTH // 2, HEIGHT // 2)  # out of the picture
    shows("4 Advisories", color="#ffb000")

    for line in json.loads(run(*command, "status", "--format", "json"))["lines"]:
        if line["state"] != "good":
            run(*command, "favorite", "remove", line["id"])
    # The widget process behind the bar's command, and the shell before it that keeps its requests.
    for parent in watching():
        for child in run("pgrep", "-P", parent).split():
            os.killpg(int(child), signal.SIGKILL)
    shows("Good Service")
    bars[0].process.kill()
    wait("the end of the bar's command", lambda: not watching())
print("shown")
