"""Homes of tests' own, programs in them, and a headless sway with a pointer and a camera."""
import os
import queue
import re
import socket
import struct
import subprocess
import tempfile
import threading
from contextlib import ExitStack

from notifications import PATIENCE, wait

LEFT, RIGHT, MIDDLE = 0x110, 0x111, 0x112
NOBODY = 65534


class Program:
    """A program with its lines of standard output, or of standard error."""

    def __init__(self, session, *command, errors=False, **options):
        streams = {"stderr" if errors else "stdout": subprocess.PIPE}
        self.process = session.start(command, stdin=subprocess.PIPE, text=True, bufsize=1, **streams, **options)
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


class Home(ExitStack):
    """A home, a log of what the widget is asked, and a program in the window's place that keeps what it is to open."""

    def __init__(self, widget=""):
        super().__init__()
        self.folder = self.enter_context(tempfile.TemporaryDirectory())
        os.chown(self.folder, os.getuid() or NOBODY, -1)
        for name, script in (("widget", f'tee -a "{self.folder}/requests" | "{widget}" "$@"'),
                             ("window", f'echo "$@" $XDG_ACTIVATION_TOKEN >>"{self.folder}/opened"')):
            with open(f"{self.folder}/{name}", "w") as file:
                file.write("#!/bin/sh\n" + script + "\n")
            os.chmod(file.name, 0o755)
        self.environment = {
            "PATH": os.environ["PATH"], "HOME": self.folder, "XDG_RUNTIME_DIR": self.folder, "LANG": "C.UTF-8",
            "NIMBO_TRANSIT_WIDGET": f"{self.folder}/widget", "NIMBO_TRANSIT_DESKTOP": f"{self.folder}/window"}

    def start(self, command, **options):
        process = subprocess.Popen(command, env=self.environment | options.pop("env", {}), **options)
        self.callback(process.wait)
        self.callback(process.kill)
        return process

    def kept(self, name):
        path = f"{self.folder}/{name}"
        return open(path).read() if os.path.exists(path) else ""

    def opened(self, pattern):
        wait(f"{pattern} opened", lambda: re.search(pattern, self.kept("opened")))
        os.remove(f"{self.folder}/opened")

    def sway(self, *configuration):
        """Starts sway with these lines of configuration and an output for each that is of one."""
        self.environment |= {"WLR_BACKENDS": "headless", "WLR_RENDERER": "pixman", "WLR_LIBINPUT_NO_DEVICES": "1",
                             "WLR_HEADLESS_OUTPUTS": str(sum(line.startswith("output") for line in configuration)),
                             "SWAYSOCK": f"{self.folder}/sway.sock",
                             "WAYLAND_DISPLAY": "wayland-1"}
        with open(f"{self.folder}/sway", "w") as config:
            config.write("\n".join(["xwayland disable", *configuration]) + "\n")
        # It refuses to be root.
        somebody = {"user": NOBODY, "group": NOBODY, "extra_groups": []} if os.getuid() == 0 else {}
        Program(self, "sway", "-c", config.name, stderr=subprocess.DEVNULL, **somebody)
        for path in f"{self.folder}/wayland-1", f"{self.folder}/sway.sock":
            wait(path, lambda: os.path.exists(path))

    def picture(self, output):
        """Width, height and pixels of an output of sway's."""
        taken = subprocess.run(["grim", "-t", "ppm", "-o", output, "-"], env=self.environment, capture_output=True)
        if taken.returncode != 0:
            return 0, 0, b""
        _, width, height, _, pixels = re.fullmatch(rb"(P6)\s(\d+)\s(\d+)\s(\d+)\s(.*)", taken.stdout, re.S).groups()
        return int(width), int(height), pixels


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

    def click(self, x, y, width, height, button=LEFT):
        # Where a pointer enters is no place to swaybar, which waits for it to move.
        moves = [message for at in (x - 1, x) for message in ((1, 0, at, y, width, height), (4,))]
        for request, *arguments in (*moves, (2, 0, button, 1), (4,), (2, 0, button, 0), (4,)):
            self.send(5, request, *arguments)
