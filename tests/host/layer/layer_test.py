#!/usr/bin/python3
"""The widget on the desktop as its user has it. usage: layer_test.py faults|sway NIMBO_TRANSIT_LAYER WIDGET COMPOSITOR"""
import os
import queue
import re
import signal
import socket
import struct
import subprocess
import sys
import tempfile
import threading
import time
from contextlib import ExitStack

PATIENCE = 60  # seconds for anything to come true
LEFT, RIGHT, MIDDLE, TAB, ENTER, ESCAPE = 0x110, 0x111, 0x112, 15, 28, 1
NOBODY = 65534
layer, widget, compositor = sys.argv[2:]


def wait(what, condition):
    deadline = time.monotonic() + PATIENCE
    while not (answer := condition()):
        if time.monotonic() > deadline:
            raise AssertionError(f"waited in vain: {what}")
        threading.Event().wait(0.02)
    return answer


class Program:
    """A program with its lines of standard output, or of standard error."""

    def __init__(self, session, *command, errors=False, **options):
        streams = {"stderr" if errors else "stdout": subprocess.PIPE}
        self.process = subprocess.Popen(command, stdin=subprocess.PIPE, text=True, bufsize=1, env=session.environment,
                                        **streams, **options)
        session.callback(self.process.wait)
        session.callback(self.process.kill)
        self.lines = queue.Queue()
        stream = self.process.stderr if errors else self.process.stdout
        threading.Thread(target=lambda: [self.lines.put(line.strip()) for line in stream], daemon=True).start()

    def say(self, line):
        self.process.stdin.write(line + "\n")

    def see(self, pattern):
        """The next line that holds the pattern; those before are passed over."""
        seen = []
        while not seen or not re.search(pattern, seen[-1]):
            try:
                seen.append(self.lines.get(timeout=PATIENCE))
            except queue.Empty:
                raise AssertionError(f"waited in vain: {pattern}; there was {seen}") from None
        return seen[-1]


class Session(ExitStack):
    """A home, a log of what the widget is asked, and a program in the window's place that keeps what it is to open."""

    def __init__(self):
        super().__init__()
        self.folder = self.enter_context(tempfile.TemporaryDirectory())
        os.chown(self.folder, os.getuid() or NOBODY, -1)
        for name, script in (("widget", f'tee -a "{self.folder}/requests" | "{widget}" "$@"'),
                             ("window", f'echo "$@" >>"{self.folder}/opened"')):
            with open(f"{self.folder}/{name}", "w") as file:
                file.write("#!/bin/sh\n" + script + "\n")
            os.chmod(file.name, 0o755)
        self.environment = {
            "PATH": os.environ["PATH"], "HOME": self.folder, "XDG_RUNTIME_DIR": self.folder, "LANG": "C.UTF-8",
            "NIMBO_TRANSIT_WIDGET": f"{self.folder}/widget", "NIMBO_TRANSIT_DESKTOP": f"{self.folder}/window"}

    def compositor(self, *without):
        program = Program(self, compositor, *without)
        self.environment["WAYLAND_DISPLAY"] = program.see("wayland")
        return program

    def layer(self, *arguments):
        folders = ["--config", self.folder, "--state", self.folder]
        return Program(self, layer, *folders, *arguments, errors=True)

    def kept(self, name):
        path = f"{self.folder}/{name}"
        return open(path).read() if os.path.exists(path) else ""

    def opened(self, pattern):
        wait(f"{pattern} opened", lambda: re.search(pattern, self.kept("opened")))
        os.remove(f"{self.folder}/opened")


def try_faults():
    with Session() as session:
        # One that never answers, and one that is not there, while the rest is tried.
        silent = session.enter_context(socket.socket(socket.AF_UNIX))
        silent.bind(f"{session.folder}/silent")
        silent.listen()
        session.environment["WAYLAND_DISPLAY"] = "silent"
        waiting = session.layer()
        session.environment["WAYLAND_DISPLAY"] = "none"
        assert "nimbo-transit-desktop" in session.layer().see("cannot reach a Wayland compositor")
        session.compositor("zwlr_layer_shell_v1")
        bare = session.layer()
        assert "nimbo-transit-desktop" in bare.see("no wlr-layer-shell") and bare.process.wait() == 3
        for wrong in (["--layer", "top", "--layer", "bottom"], ["--layer", "under"], ["--margin", "1,2"], ["--width", "1"]):
            program = session.layer(*wrong)
            program.see(wrong[0]), program.process.wait() == 2 or sys.exit(wrong)

        screen = session.compositor("wp_viewporter")
        whole = session.layer("--margin", "0")
        screen.see("shown 718x220 as 0x0 of 359x110, scale 2, row #f6f6f8, drawn")
        whole.process.send_signal(signal.SIGTERM)
        assert whole.process.wait() == 0

        screen = session.compositor()
        host = session.layer("--output", "TEST-1", "--output", "TEST-1")
        screen.see("shown 539x165 as 359x110 of 359x110, scale 1, row #f6f6f8, drawn")
        screen.say("scale 120")
        screen.see("shown 359x110 as 359x110")

        def click(x, y, button=LEFT):
            screen.say(f"press {button} {x} {y}")
            screen.say(f"release {button} {x} {y}")

        click(50, 50)
        tall = int(screen.see(r"shown 359x(220|330|440) as 359x\1 of 359x\1").split("x")[1].split()[0])
        click(50, 50)
        session.opened(r"--state .* -- nimbo://activity\?type=org.nimbo.Map.Transit.Incident&bs=\S")
        screen.say("press %d 50 50" % LEFT)
        screen.say("move 50 %d" % (tall - 20))
        screen.say("release %d 50 50" % LEFT)
        click(50, tall - 20)
        screen.see("shown 359x110 as")
        assert not session.kept("opened"), "a hand that moves off a row opens nothing"
        screen.say(f"touch 50 50\nlift")
        screen.see(f"shown 359x{tall}")
        screen.say(f"key {ESCAPE}")
        screen.see("shown 359x110")
        screen.say(f"key {TAB}")
        screen.see("shown 359x110 .* row #(?!f6f6f8)")  # the row is lit
        screen.say(f"key {ENTER}")
        screen.see(f"shown 359x{tall}")
        click(50, 50, MIDDLE)
        screen.see("shown 359x110")
        click(50, 50, RIGHT)
        session.opened("-- nimbo://$")

        for given, shown in (("300 0", "300x110 as"), ("100000 100000", "359x110 as"), ("1 1", "200x110 as"), ("0 0", "359x110 as")):
            screen.say(f"configure {given}")
            screen.see(f"shown {shown}")

        # Buffers that are not given back: nothing is drawn into what is shown, and it goes on when they are.
        screen.say("hold 1")
        for _ in range(4):
            screen.say(f"key {TAB}\nkey {ESCAPE}")
        screen.see("shown")
        screen.say("hold 0")
        screen.say(f"key {TAB}")
        screen.see("shown 359x110 .* row #(?!f6f6f8)")
        screen.say(f"key {ESCAPE}")
        screen.see("shown 359x110 .* row #f6f6f8")

        screen.say("frames 0")
        screen.say(f"key {TAB}")
        wait("a row to light", lambda: '"highlighted":true' in session.kept("requests").splitlines()[-1])
        os.truncate(f"{session.folder}/requests", 0)
        wait("the widget is told that it is hidden", lambda: "viewDidDisappear" in session.kept("requests"))
        assert "render" not in session.kept("requests"), session.kept("requests")
        screen.say("frames 1")
        screen.see("shown 359x110")

        screen.say("close")
        screen.see("closed")
        screen.see("shown 359x110 .* drawn")

        screen.say("unplug")
        screen.see("closed")
        screen.say("plug")
        screen.see("shown 359x110 .* drawn")

        os.killpg(int(subprocess.check_output(["pgrep", "-P", str(host.process.pid)])), signal.SIGKILL)
        host.see("the widget process on TEST-1 is ended: it ended")
        screen.see("shown 359x110 .* drawn")

        first = session.environment["WAYLAND_DISPLAY"]
        screen.process.kill()
        host.see("the compositor is gone; looking")
        screen.process.wait()
        screen = session.compositor()
        assert session.environment["WAYLAND_DISPLAY"] == first
        screen.see("shown 539x165 .* drawn")
        other = session.layer()
        screen.see("shown 539x165 .* drawn")
        for program in (host, other):
            program.process.send_signal(signal.SIGTERM)
            assert program.process.wait() == 0
        waiting.see("the compositor does not answer")
        assert waiting.process.wait() == 1


class Pointer:
    """A pointer of the tests' own: the few messages of zwlr_virtual_pointer_v1 that a click takes, as they are sent."""

    def __init__(self, path):
        self.socket = socket.socket(socket.AF_UNIX)
        self.socket.connect(path)
        self.send(1, 1, 2)  # wl_display.get_registry
        self.send(1, 0, 3)  # wl_display.sync
        globals_, received = {}, b""
        while 3 not in globals_:
            received += self.socket.recv(65536)
            while len(received) >= 8 and len(received) >= (size := struct.unpack_from("=I", received, 4)[0] >> 16):
                sender, words = struct.unpack_from("=I", received)[0], received[8:size]
                if sender == 2:
                    name, length = struct.unpack_from("=II", words)
                    globals_[words[8:8 + length - 1].decode()] = name
                globals_[sender] = True
                received = received[size:]
        interface = b"zwlr_virtual_pointer_manager_v1\0"
        self.send(2, 0, globals_[interface[:-1].decode()], len(interface), interface, 1, 4)  # wl_registry.bind
        self.send(4, 0, 0, 5)  # create_virtual_pointer, for any seat

    def send(self, sender, request, *arguments):
        body = b"".join(a + bytes(-len(a) % 4) if isinstance(a, bytes) else struct.pack("=I", a) for a in arguments)
        self.socket.sendall(struct.pack("=II", sender, (len(body) + 8) << 16 | request) + body)

    def click(self, x, y, width, height):
        for request, *arguments in ((1, 0, x, y, width, height), (4,), (2, 0, LEFT, 1), (4,), (2, 0, LEFT, 0), (4,)):
            self.send(5, request, *arguments)


def try_sway():
    with Session() as session:
        session.environment |= {"WLR_BACKENDS": "headless", "WLR_RENDERER": "pixman", "WLR_HEADLESS_OUTPUTS": "2",
                                "WLR_LIBINPUT_NO_DEVICES": "1", "SWAYSOCK": f"{session.folder}/sway.sock"}
        with open(f"{session.folder}/config", "w") as config:
            config.write("xwayland disable\noutput HEADLESS-1 resolution 800x600 position 0 0 scale 1\n"
                         "output HEADLESS-2 resolution 1600x1200 position 800 0 scale 2\n")

        def sway():
            # It refuses to be root.
            somebody = {"user": NOBODY, "group": NOBODY, "extra_groups": []} if os.getuid() == 0 else {}
            started = Program(session, "sway", "-c", config.name, stderr=subprocess.DEVNULL, **somebody)
            for path in ("wayland-1", "sway.sock"):
                wait(path, lambda: os.path.exists(f"{session.folder}/{path}"))
            return started

        def picture(output):
            """Width, height and pixels of an output."""
            taken = subprocess.run(["grim", "-t", "ppm", "-o", output, "-"], env=session.environment, capture_output=True)
            if taken.returncode != 0:
                return 0, 0, b""
            _, width, height, _, pixels = re.fullmatch(rb"(P6)\s(\d+)\s(\d+)\s(\d+)\s(.*)", taken.stdout, re.S).groups()
            return int(width), int(height), pixels

        def is_shown(output, scale, heights):
            """Whether the widget stands at the top right, so high, and is not blank."""
            width, _, pixels = picture(output)
            if not width:
                return False

            def at(x, y):
                return pixels[3 * (y * width + x):][:3]
            background, left, top = at(0, 0), width - (16 + 359) * scale, 16 * scale
            column = [at(left + 2 * scale, y) != background for y in range(top, top + 460 * scale)]
            high = column.index(False) / scale
            edges = [at(left - 1, top), at(left, top - 1), at(width - 16 * scale, top)] == [background] * 3
            row = {at(left + x, top + 68 * scale) for x in range(16 * scale, 343 * scale)}
            return edges and high in heights and len(row) > 4 and high

        compositor_ = sway()
        session.environment["WAYLAND_DISPLAY"] = "wayland-1"
        pointer = Pointer(f"{session.folder}/wayland-1")
        host = session.layer(*(word for number in "123" for word in ("--output", f"HEADLESS-{number}")))
        host.see("waiting for the output HEADLESS-3; there are: HEADLESS-1, HEADLESS-2")
        screens = (("HEADLESS-1", 1), ("HEADLESS-2", 2))
        for output, scale in screens:
            wait(f"rows on {output}", lambda: is_shown(output, scale, [110]))
        pointer.click(600, 60, 1600, 600)
        wait("a row for each incident", lambda: is_shown("HEADLESS-1", 1, [220, 330, 440]))
        assert is_shown("HEADLESS-2", 2, [110]), "each output has a widget of its own"

        subprocess.run(["swaymsg", "create_output"], env=session.environment, check=True, stdout=subprocess.DEVNULL)
        wait("rows on an output that comes", lambda: is_shown("HEADLESS-3", 1, [110]))

        compositor_.process.kill()
        compositor_.process.wait()
        for path in ("wayland-1", "sway.sock"):
            os.remove(f"{session.folder}/{path}")
        host.see("the compositor is gone; looking")
        sway()
        for output, scale in screens:
            wait(f"rows on {output} again", lambda: is_shown(output, scale, [110, 220, 330, 440]))
        if pictures := os.environ.get("NIMBO_PICTURES"):
            for output, _ in screens:
                subprocess.run(["grim", "-o", output, f"{pictures}/{output}.png"], env=session.environment, check=True)


{"faults": try_faults, "sway": try_sway}[sys.argv[1]]()
print("shown")
