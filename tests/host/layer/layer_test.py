#!/usr/bin/python3
"""The widget on the desktop as its user has it. usage: layer_test.py faults|sway NIMBO_TRANSIT NIMBO_TRANSIT_LAYER
WIDGET COMPOSITOR"""
import os
import signal
import socket
import subprocess
import sys
import threading

from gi.repository import GLib
from notifications import Service, start_bus
from sway_session import LEFT, MIDDLE, RIGHT, Home, Pointer, Program, wait


TAB, ENTER, ESCAPE = 15, 28, 1
program, layer, widget, compositor = sys.argv[2:]


class Session(Home):
    """The rows of the last time are there, so that a click finds what can be expanded."""

    def __init__(self):
        super().__init__(widget)
        self.folders = ["--config", self.folder, "--state", self.folder]
        assert self.start([program, *self.folders, "update"], stdout=subprocess.DEVNULL).wait() == 0

    def compositor(self, *without):
        program = Program(self, compositor, *without)
        self.environment["WAYLAND_DISPLAY"] = program.see("wayland")
        return program

    def layer(self, *arguments):
        return Program(self, layer, *self.folders, *arguments, errors=True)


class Portal(Service):
    """The desktop's, of a user who wants it dark. Source: XDG Desktop Portal, org.freedesktop.portal.Settings."""

    def __init__(self, address):
        super().__init__(address, "org.freedesktop.portal.Desktop", "/org/freedesktop/portal/desktop",
                         """<interface name="org.freedesktop.portal.Settings"><method name="Read">
                         <arg type="s" direction="in"/><arg type="s" direction="in"/><arg type="v" direction="out"/>
                         </method></interface>""")

    def Read(self, invocation, namespace, key):
        assert (namespace, key) == ("org.freedesktop.appearance", "color-scheme")
        invocation.return_value(GLib.Variant("(v)", (GLib.Variant("v", GLib.Variant("u", 1)),)))

    def prefer(self, scheme):
        self.bus.emit_signal(None, self.path, "org.freedesktop.portal.Settings", "SettingChanged", GLib.Variant(
            "(ssv)", ("org.freedesktop.appearance", "color-scheme", GLib.Variant("u", scheme))))


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

        screen.process.kill()
        host.see("the compositor is gone; looking")
        screen.process.wait()
        screen = session.compositor()
        screen.see("shown 539x165 .* drawn")
        other = session.layer()
        screen.see("shown 539x165 .* drawn")
        for program in (host, other):
            program.process.send_signal(signal.SIGTERM)
            assert program.process.wait() == 0
        address = session.environment["DBUS_SESSION_BUS_ADDRESS"] = start_bus(session, f"{session.folder}/bus")
        portal = Portal(address)
        threading.Thread(target=GLib.MainLoop().run, daemon=True).start()
        session.layer()
        for scheme, row in ((2, "1e1e20"), (1, "f6f6f8"), (0, "1e1e20")):
            screen.see(f"shown 539x165 .* row #{row}")
            portal.prefer(scheme)
        screen.see("shown 539x165 .* row #f6f6f8")

        waiting.see("the compositor does not answer")
        _, status, usage = os.wait4(waiting.process.pid, 0)
        assert os.waitstatus_to_exitcode(status) == 1 and usage.ru_utime + usage.ru_stime < 2, "it sleeps while it waits"


def try_sway():
    with Session() as session:
        def is_shown(output, scale, heights):
            """Whether the widget stands at the top right, so high, and is not blank."""
            width, _, pixels = session.picture(output)
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

        session.sway("output HEADLESS-1 resolution 800x600 position 0 0 scale 1",
                     "output HEADLESS-2 resolution 1600x1200 position 800 0 scale 2")
        pointer = Pointer(f"{session.folder}/wayland-1")
        host = session.layer(*(word for number in "123" for word in ("--output", f"HEADLESS-{number}")))
        host.see("waiting for the output HEADLESS-3; there are: HEADLESS-1, HEADLESS-2")
        for output, scale in ("HEADLESS-1", 1), ("HEADLESS-2", 2):
            wait(f"rows on {output}", lambda: is_shown(output, scale, [110]))
        pointer.click(600, 60, 1600, 600)
        wait("a row for each incident", lambda: is_shown("HEADLESS-1", 1, [220, 330, 440]))
        assert is_shown("HEADLESS-2", 2, [110]), "each output has a widget of its own"

        subprocess.run(["swaymsg", "create_output"], env=session.environment, check=True, stdout=subprocess.DEVNULL)
        wait("rows on an output that comes", lambda: is_shown("HEADLESS-3", 1, [110]))



{"faults": try_faults, "sway": try_sway}[sys.argv[1]]()
print("shown")
