"""A session bus of a test's own, a desktop's notification service on it, and an application that keeps what it is to
open. Source: Desktop Notifications Specification 1.2 and Desktop Entry Specification, both of freedesktop.org."""
import os
import re
import subprocess
import time

from gi.repository import Gio, GLib

PATIENCE = 60  # seconds for anything to come true
NOTIFICATIONS = "org.freedesktop.Notifications"
NOTIFICATIONS_PATH = "/org/freedesktop/Notifications"


def wait_for(condition, seconds=PATIENCE):
    """The condition's first answer that is true; asked again whenever something happens, and every 20 ms."""
    deadline, context = time.monotonic() + seconds, GLib.MainContext.default()
    while time.monotonic() < deadline:
        try:
            if answer := condition():
                return answer
        except GLib.Error:
            pass  # what was looked at is gone
        GLib.timeout_add(20, lambda: False)
        context.iteration(True)


def wait(what, condition):
    if answer := wait_for(condition):
        return answer
    raise AssertionError(f"waited in vain: {what}")


def start_bus(stack, folder, services={}):
    """Starts a bus, until the stack ends, that can start the programs of `services` (the text of each service file by its
    name, with the program that it is to start). Gives the address."""
    os.makedirs(f"{folder}/services", exist_ok=True)
    for name, (text, program) in services.items():
        with open(f"{folder}/services/{name}", "w") as file:
            file.write(re.sub("(?m)^Exec=.*", f"Exec={program}", text))
    with open(f"{folder}/bus.conf", "w") as file:
        file.write(f"""<busconfig><type>session</type><listen>unix:dir={folder}</listen><auth>EXTERNAL</auth>
            <servicedir>{folder}/services</servicedir><policy context="default"><allow send_destination="*"/>
            <allow receive_sender="*"/><allow own="*"/></policy></busconfig>""")
    bus = subprocess.Popen(["dbus-daemon", f"--config-file={folder}/bus.conf", "--nofork", "--print-address=1"],
                           stdout=subprocess.PIPE, text=True)
    stack.callback(bus.wait)
    stack.callback(bus.kill)
    return bus.stdout.readline().strip()


def connect(address):
    flags = Gio.DBusConnectionFlags
    return Gio.DBusConnection.new_for_address_sync(
        address, flags.AUTHENTICATION_CLIENT | flags.MESSAGE_BUS_CONNECTION, None, None)


class Service:
    """Something with a name on the bus, until `leave`. Its methods are those of the class."""

    def __init__(self, address, name, path, xml):
        self.bus = connect(address)
        self.name, self.path = name, path
        self.bus.register_object(path, Gio.DBusNodeInfo.new_for_xml(f"<node>{xml}</node>").interfaces[0],
                                 self.called, None, None)
        self.bus.call_sync("org.freedesktop.DBus", "/org/freedesktop/DBus", "org.freedesktop.DBus", "RequestName",
                           GLib.Variant("(su)", (name, 4)), None, 0, -1, None)

    def called(self, _bus, _sender, _path, _interface, method, parameters, invocation):
        getattr(self, method)(invocation, *parameters.unpack())

    def leave(self):
        self.bus.close_sync(None)


class NotificationService(Service):
    """Keeps what it shows: `standing` by number, `shown` in order with what was replaced, as dictionaries."""

    def __init__(self, address, capabilities=("actions", "body", "body-markup"), answer="u", first_id=1):
        super().__init__(address, NOTIFICATIONS, NOTIFICATIONS_PATH, f"""<interface name="{NOTIFICATIONS}">
            <method name="GetCapabilities"><arg type="as" direction="out"/></method>
            <method name="Notify"><arg type="s" direction="in"/><arg type="u" direction="in"/>
              <arg type="s" direction="in"/><arg type="s" direction="in"/><arg type="s" direction="in"/>
              <arg type="as" direction="in"/><arg type="a{{sv}}" direction="in"/><arg type="i" direction="in"/>
              <arg type="{answer}" direction="out"/></method>
            <method name="CloseNotification"><arg type="u" direction="in"/></method></interface>""")
        self.capabilities, self.answer, self.next_id = list(capabilities), answer, first_id
        self.standing, self.shown = {}, []
        self.held = None  # a list: Notify is not answered, but its invocations kept there

    def GetCapabilities(self, invocation):
        invocation.return_value(GLib.Variant("(as)", (self.capabilities,)))

    def Notify(self, invocation, app, replaces, icon, title, body, actions, hints, timeout):
        number = replaces
        if replaces not in self.standing:
            number, self.next_id = self.next_id, self.next_id + 1
        notification = {"id": number, "replaces": replaces, "app": app, "icon": icon, "title": title, "body": body,
                        "actions": actions, "hints": hints, "timeout": timeout}
        self.standing[number] = notification
        self.shown.append(notification)
        answer = GLib.Variant(f"({self.answer})", (number if self.answer == "u" else "nonsense",))
        if self.held is None:
            invocation.return_value(answer)
        else:
            self.held.append((invocation, answer))

    def CloseNotification(self, invocation, number):
        self.close(number, reason=3)
        invocation.return_value(None)

    def titles(self):
        return [notification["title"] for notification in self.standing.values()]

    def find(self, title):
        return next((number for number, each in self.standing.items() if each["title"] == title), None)

    def see(self, title):
        """The number of the notification that stands with this title, once it does."""
        return wait(f"{title}; there is {self.titles()}", lambda: self.find(title))

    def answer_held(self):
        held, self.held = self.held, None
        for invocation, answer in held:
            invocation.return_value(answer)

    def say(self, signal, signature, *arguments, receiver=None):
        self.bus.emit_signal(receiver, NOTIFICATIONS_PATH, NOTIFICATIONS, signal,
                             GLib.Variant(signature, arguments))
        self.bus.flush_sync(None)

    def close(self, number, reason=2):
        """As the user does (2), or time (1)."""
        if self.standing.pop(number, None):
            self.say("NotificationClosed", "(uu)", number, reason)

    def click(self, number, token=None):
        if token:
            self.say("ActivationToken", "(us)", number, token)
        self.say("ActionInvoked", "(us)", number, "default")
        self.close(number)


class Application(Service):
    """Stands in for a program of the desktop that is started by its name on the bus."""

    def __init__(self, address, name="org.nimbo.Transit"):
        super().__init__(address, name, "/" + name.replace(".", "/"), """<interface name="org.freedesktop.Application">
            <method name="Open"><arg type="as" direction="in"/><arg type="a{sv}" direction="in"/></method>
            </interface>""")
        self.opened = []

    def Open(self, invocation, addresses, platform_data):
        self.opened.append((addresses, platform_data))
        invocation.return_value(None)
