"""A display, a session bus and a home of a test's own, and windows on them as keyboard, pointer and screen reader have
them."""
import os
import re
import subprocess
from contextlib import ExitStack

from notifications import PATIENCE, wait, wait_for


class Session(ExitStack):
    """Starts Xvfb and a bus, and ends them. Nothing of the user's desktop is seen or touched."""

    def __init__(self, folder):
        super().__init__()
        self.environment = {"PATH": os.environ["PATH"], "HOME": folder, "XDG_RUNTIME_DIR": folder, "LANG": "C.UTF-8",
                            "TZ": "UTC", "GTK_A11Y": "atspi", "G_DEBUG": "fatal-criticals"}
        # Without -noreset the server would forget everything whenever its last client leaves.
        self.environment["DISPLAY"] = ":" + self.serve(
            lambda fd: ["Xvfb", "-displayfd", str(fd), "-screen", "0", "1024x1024x24", "-noreset"])
        self.environment["DBUS_SESSION_BUS_ADDRESS"] = self.serve(
            lambda fd: ["dbus-daemon", "--session", "--nofork", f"--print-address={fd}"])
        os.environ.update(self.environment)
        global Atspi
        import gi
        gi.require_version("Atspi", "2.0")
        from gi.repository import Atspi

    def serve(self, command):
        """Starts a server that tells its address on a file descriptor, and gives the address."""
        reading, writing = os.pipe()
        self.start(command(writing), pass_fds=[writing], stderr=subprocess.DEVNULL)
        os.close(writing)
        with os.fdopen(reading) as address:
            return address.readline().strip()

    def start(self, command, **options):
        process = subprocess.Popen(command, env=self.environment | options.pop("env", {}), **options)
        self.callback(process.wait)
        self.callback(process.kill)
        return process


class Window:
    def __init__(self, session, program, *arguments, **environment):
        self.process = session.start([program, *arguments], env=environment)

    def frame(self):
        desktop = Atspi.get_desktop(0)
        applications = [desktop.get_child_at_index(i) for i in range(desktop.get_child_count())]
        return next((application.get_child_at_index(0) for application in applications if application
                     and application.get_process_id() == self.process.pid and application.get_child_count()), None)

    def dialog(self):
        """What stands in front of the window."""
        application = self.frame() and self.frame().get_application()
        if application and application.get_child_count() > 1:
            return application.get_child_at_index(1)

    def nodes(self, node=None):
        """What there is on the page, as a screen reader walks it."""
        if not node and (dialog := self.dialog()):
            yield from self.nodes(dialog)
        if node := node or self.frame():
            node.clear_cache()
            yield node
            for i in range(node.get_child_count()):
                if child := node.get_child_at_index(i):
                    yield from self.nodes(child)

    def find(self, name, role=None):
        return next((node for node in self.nodes()
                     if re.search(name, node.get_name()) and role in (None, node.get_role_name())), None)

    def see(self, name, role=None):
        try:
            return wait(name, lambda: self.find(name, role))
        except AssertionError as vain:
            there = "\n".join(f"{node.get_role_name()}: {node.get_name()}" for node in self.nodes() if node.get_name())
            raise AssertionError(f"{vain}; there is\n{there}") from None

    def see_page(self, title):
        wait(f"the page {title}",
             lambda: self.frame() and re.fullmatch("(.* new – )?" + title, self.frame().get_name()))

    def box(self, name, role):
        return self.see(name, role).get_extents(Atspi.CoordType.WINDOW)

    def is_checked(self, name, role):
        return self.see(name, role).get_state_set().contains(Atspi.StateType.CHECKED)

    def click(self, name, role="push button"):
        def place():
            box = self.box(name, role)
            # A page that is still to slide in stands beside the window.
            return box.width > 0 and box.height > 1 and box.x >= 0 and (box.x + box.width // 2, box.y + box.height // 2)

        def is_in_view():
            box, window = self.box(name, role), self.frame().get_extents(Atspi.CoordType.WINDOW)
            if box.height <= 1 or box.y + box.height <= window.height:
                return True
            press("mousemove", str(window.width // 2), str(window.height // 2), "click", "5")

        wait(f"{name} in view", is_in_view)
        places = [None, wait(f"a place of {name}", place)]
        # Until it stands still.
        wait(f"rest of {name}", lambda: places.append(wait(name, place)) or places[-3:].count(places[-1]) == 3)
        press("mousemove", *map(str, places[-1]), "click", "1")

    def fill(self, *entries):
        """Types the texts into the entries of a form, in place of what they hold, and sends it."""
        for entry, text in entries:
            self.click(entry, "text")
            press("key", "ctrl+a", "type", text)
        press("key", "Return")

    def surfaces(self):
        """The visible windows of the program: a row that is dragged is one of its own."""
        return subprocess.run(["xdotool", "search", "--onlyvisible", "--pid", str(self.process.pid)],
                              capture_output=True, text=True).stdout.split()

    def drag(self, name, target, done, role="list item"):
        """Drags a row onto another one, anew where it was let go before the row under it had answered."""
        def is_done():
            source, place = self.box(name, role), self.box(target, role)
            resting = len(self.surfaces())
            press("mousemove", str(source.x + 90), str(source.y + 30), "mousedown", "1")
            # The pointer's release is lost while the display is still being asked for the pointer.
            for step in range(1, 9):
                press("mousemove", str(source.x + 90), str(source.y + 30 + (place.y - source.y) * step // 8))
                if step == 4 and not wait_for(lambda: len(self.surfaces()) > resting, 2):
                    break
            press("mouseup", "1")
            if wait_for(done, 2):
                return True
            if len(self.surfaces()) > resting:
                press("key", "Escape")
                wait("the row back in its place", lambda: len(self.surfaces()) <= resting)
        wait(f"{name} on {target}", is_done)

    def comes_to_front(self):
        """There is no window manager that would raise a window and give it the keyboard."""
        window = wait("the window", self.surfaces)[0]
        press("windowraise", window, "windowfocus", "--sync", window)
        return window

    def children(self):
        return subprocess.run(["pgrep", "-P", str(self.process.pid)], capture_output=True, text=True).stdout.split()

    def quit(self):
        press("key", "ctrl+q")
        assert self.process.wait(PATIENCE) == 0, self.process.returncode


def press(*events):
    """Events of the X server's own, as from keyboard and pointer: see xdotool."""
    subprocess.run(["xdotool", *events], check=True)
