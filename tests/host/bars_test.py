#!/usr/bin/python3
"""Status bars as their users have them: what a bar shows of the widget is what it shows, on its other side, of lines that
stand in a file. usage: bars_test.py swaybar|waybar|polybar NIMBO_TRANSIT WIDGET"""
import json
import mmap
import os
import shutil
import signal
import struct
import subprocess
import sys

from sway_session import LEFT, MIDDLE, RIGHT, Home, Pointer, Program, wait

WIDTH, HEIGHT, BAR = 800, 600, 30
bar, program, widget = sys.argv[1:]
if missing := [needed for needed in [bar, "Xvfb" if bar == "polybar" else "sway"] if not shutil.which(needed)]:
    print("skipped: not installed:", *missing)
    sys.exit(77)


class Session(Home):
    def __init__(self):
        super().__init__(widget)
        self.command = [program, "--config", self.folder, "--state", self.folder]
        self.expected = open(f"{self.folder}/expected", "w", buffering=1)

    def run(self, *arguments):
        return subprocess.run([*self.command, *arguments], env=self.environment, check=True, capture_output=True,
                              text=True).stdout

    def status(self, form):
        return " ".join([*self.command, "status", "--format", form, "--watch"])

    def write(self, name, text):
        with open(f"{self.folder}/{name}", "w") as file:
            file.write(text)
        return file.name

    def watching(self):
        """Identifiers of the processes that a bar has started for the status."""
        return subprocess.run(["pgrep", "-f", f"^{' '.join(self.command)} status"], capture_output=True,
                              text=True).stdout.split()

    def end_widget(self):
        """The widget process behind the bar's command, and the shell before it that keeps its requests."""
        for parent in self.watching():
            for child in subprocess.run(["pgrep", "-P", parent], capture_output=True, text=True).stdout.split():
                os.killpg(int(child), signal.SIGKILL)


def shows(session, take, line):
    """Waits until the bar shows what the line shows, which is not nothing."""
    session.expected.write(line + "\n")

    def is_alike():
        pixels = take()
        top, rest, bottom = (pixels[3 * WIDTH * at:][:3 * WIDTH * BAR] for at in (0, BAR, HEIGHT - BAR))
        return top == bottom != rest and len({top[i:i + 3] for i in range(0, len(top), 3)}) > 8
    wait(line, is_alike)


def in_sway(session, *configuration):
    session.sway(f"output HEADLESS-1 resolution {WIDTH}x{HEIGHT} position 0 0 scale 1 bg #336699 solid_color", *configuration)
    return lambda: session.picture("HEADLESS-1")[2]


def try_swaybar(session):
    def block(text, **others):
        return json.dumps([{"full_text": text, **others}]) + ","

    side = "bar {{\nid {}\nposition {}\nstatus_command {}\nswaybar_command true\nheight {}\nworkspace_buttons no\n}}"
    session.expected.write('{"version":1}\n[\n')
    take = in_sway(session, side.format("shown", "top", session.status("i3bar"), BAR),
                   side.format("expected", "bottom", f"tail -n +1 -f {session.expected.name}", BAR))
    pointer = Pointer(f"{session.folder}/wayland-1")
    bars = [Program(session, "swaybar", "-b", name) for name in ("shown", "expected")]
    shows(session, take, block("● 4 Advisories", color="#ffb000", urgent=True))

    for button, page in ((LEFT, "nimbo://"), (RIGHT, "nimbo://planned")):
        pointer.click(WIDTH - 40, BAR // 2, WIDTH, HEIGHT, button)
        session.opened(f"--state .* -- {page}\n")
    pointer.click(WIDTH - 40, BAR // 2, WIDTH, HEIGHT, MIDDLE)
    pointer.click(WIDTH // 2, HEIGHT // 2, WIDTH, HEIGHT)  # out of the picture
    shows(session, take, block("4 Advisories", color="#ffb000"))
    return take, block("Good Service"), bars[0]


def try_waybar(session):
    def line(text, state, *others, **values):
        return json.dumps({"text": text, "alt": state, "class": [state, *others], **values})

    def side(position, command):
        return {"position": position, "height": BAR, "modules-right": [f"custom/{position}"], f"custom/{position}": {
            "exec": command, "return-type": "json", "format": "{icon} {} {percentage}",
            "format-icons": {"advisories": "A", "good": "G", "error": "E"}}}

    style = session.write("style", "* { font: 14px DejaVu Sans; border: none; } window { background: #222; color: #fff; }\n"
                          ".advisories { background: #a50; } .good { background: #050; } .new { color: #ff0; }\n")
    config = session.write("waybar", json.dumps([side("top", session.status("waybar")),
                                                 side("bottom", f"tail -n +1 -f {session.expected.name}")]))
    take = in_sway(session)
    started = Program(session, "waybar", "-c", config, "-s", style)
    states = [report["state"] for report in json.loads(session.run("status", "--format", "json"))["lines"]]
    percentage = 100 * states.count("good") // len(states)
    shows(session, take, line("● 4 Advisories", "advisories", "new", percentage=percentage))
    return take, line("Good Service", "good", percentage=100), started


def try_polybar(session):
    reading, writing = os.pipe()
    Program(session, "Xvfb", "-displayfd", str(writing), "-screen", "0", f"{WIDTH}x{HEIGHT}x24", "-noreset", "-fbdir",
            session.folder, pass_fds=[writing])
    os.close(writing)
    with os.fdopen(reading) as display:
        session.environment["DISPLAY"] = ":" + display.readline().strip()
    side = ("[bar/{0}]\nwidth = 100%\nheight = {3}\nbottom = {1}\noverride-redirect = true\nmodules-right = {0}\n"
            "font-0 = DejaVu Sans:size=10\n[module/{0}]\ntype = custom/script\nexec = {2}\ntail = true\n")
    config = session.write("polybar", side.format("shown", "false", session.status("line"), BAR) +
                           side.format("expected", "true", f"tail -n +1 -f {session.expected.name}", BAR))
    bars = [Program(session, "polybar", "-c", config, name) for name in ("shown", "expected")]

    def take():
        """The screen's memory, as xwd(1) writes it."""
        with open(f"{session.folder}/Xvfb_screen0", "rb") as file, mmap.mmap(file.fileno(), 0, access=mmap.ACCESS_READ) as screen:
            header = struct.unpack_from(">25I", screen)
            pixels = screen[header[0] + 12 * header[19]:]
        rows = (pixels[header[12] * y:header[12] * y + 4 * WIDTH] for y in range(HEIGHT))
        return b"".join(row[i + 2:i + 3] + row[i + 1:i + 2] + row[i:i + 1] for row in rows for i in range(0, 4 * WIDTH, 4))

    shows(session, take, "● 4 Advisories")
    return take, "Good Service", bars[0]


with Session() as session:
    take, good, started = {"swaybar": try_swaybar, "waybar": try_waybar, "polybar": try_polybar}[bar](session)
    for line in json.loads(session.run("status", "--format", "json"))["lines"]:
        if line["state"] != "good":
            session.run("favorite", "remove", line["id"])
    session.end_widget()
    shows(session, take, good)
    started.process.kill()
    wait("the end of the bar's command", lambda: not session.watching())
print("shown")
