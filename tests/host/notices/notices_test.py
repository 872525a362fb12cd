#!/usr/bin/python3
"""Notifications as a desktop gets them. usage: notices_test.py shown|faults NIMBO_TRANSIT_NOTICES DRIVER SERVICE_FILE"""
import json
import os
import socket
import sys

from gi.repository import GLib
from notifications import NOTIFICATIONS, Application, NotificationService, connect, start_bus, wait
from sway_session import Home, Program

program, driver, service_file = sys.argv[2:]
NAME = "org.nimbo.Transit.Notices"
NO_BUS, NO_SERVICE, NO_ANSWER, REFUSED, UNFIT = range(1, 6)


class Driver(Program):
    """A program that hands notices over, or with "serve" one that takes them, in time that the test moves."""

    def __init__(self, session, address, mode="send"):
        super().__init__(session, driver, mode, env={"DBUS_SESSION_BUS_ADDRESS": address})
        self.count = 0

    def say(self, **line):
        self.count += 1
        super().say(json.dumps(dict(line, number=self.count)))
        return self.count

    def hear(self):
        wait("a line", lambda: not self.lines.empty())
        return json.loads(self.lines.get())

    def post(self, *notices, error=0):
        self.say(post=notices)
        self.answered(error)

    def close(self, *keys):
        self.say(close=keys)
        self.answered()

    def answered(self, error=0):
        answer = self.hear()
        assert answer.get("error") == error and bool(answer["reason"]) == bool(error), (answer, error)


class Session(Home):
    """A bus that starts the program under test where that is installed."""

    def __init__(self, installed=True):
        super().__init__()
        os.environ["NIMBO_TRANSIT_DESKTOP"] = self.environment["NIMBO_TRANSIT_DESKTOP"]
        services = {NAME + ".service": (open(service_file).read(), program)} if installed else {}
        self.address = start_bus(self, self.folder, services)
        self.bus = connect(self.address)

    def driver(self, mode="send"):
        return Driver(self, self.address, mode)

    def ask(self, name, path, method, parameters):
        return self.bus.call_sync(name, path, name, method, parameters, None, 0, 60000, None)

    def owner(self, name=NAME):
        try:
            return self.ask("org.freedesktop.DBus", "/", "GetNameOwner", GLib.Variant("(s)", (name,))).unpack()[0]
        except GLib.Error:
            return None

    def refuses(self, parameters):
        try:
            self.ask(NAME, "/org/nimbo/Transit/Notices", "Post", parameters)
        except GLib.Error as error:
            return error.message
        raise AssertionError("was taken")


def notice(title="No trains on 1", key="1", **more):
    return dict(more, key=key, title=title)


def fields(notification):
    hints = notification["hints"]
    return (notification["id"], notification["replaces"], notification["title"], notification["body"],
            hints["urgency"], hints["suppress-sound"])


def try_shown():
    with Session() as session:
        desktop, first, second = NotificationService(session.address), session.driver(), session.driver()
        first.post(notice(body="Signals <fail> & smoke", opens="nimbo://incident?id=7"))
        shown = desktop.shown[0]
        assert fields(shown) == (1, 0, "No trains on 1", "Signals &lt;fail&gt; &amp; smoke", 1, False), shown
        assert shown["actions"][:1] == ["default"] and shown["hints"]["desktop-entry"] == "org.nimbo.Transit", shown
        same = notice(body="Signals <fail> & smoke", opens="nimbo://incident?id=7")
        for sender in first, second:
            sender.post(same)
        second.post(dict(same, silent=True))
        assert len(desktop.shown) == 1, "the same is told once"
        second.post(notice("Few trains on 1", silent=True))
        first.post(notice("Few trains on 1", urgency=2))
        first.post(notice("No trains", urgency=2, silent=True), notice("Lift", key="2", urgency=0))
        assert [fields(each) for each in desktop.shown[1:]] == [
            (1, 1, "Few trains on 1", "", 0, True), (1, 1, "Few trains on 1", "", 2, False),
            (1, 1, "No trains", "", 2, True), (2, 0, "Lift", "", 0, False)], desktop.shown

        # What the user takes away stays away, until something else is told.
        for reason in 2, 1:
            desktop.close(desktop.see("Lift"), reason)
            for other in notice("Lift", key="2", urgency=0), notice("Lifts", key="2", silent=True), notice("Lifts", key="2"):
                second.post(other)
            assert desktop.titles() == ["No trains"], desktop.titles()
            second.post(notice("Lift", key="2", urgency=0))
            assert desktop.shown[-1]["replaces"] == 0
        second.post(notice("New", key="3", silent=True))
        assert desktop.titles() == ["No trains", "Lift"], "in silence nothing new is shown"

        # Two programs at once.
        desktop.held = []
        first.say(post=[notice("Bus", key="4")]), second.say(post=[notice("Bus", key="4")])
        second.say(close=["no such"]), second.answered()  # what came before is taken, too
        first.say(post=[notice("Tram", key="4")]), first.say(close=["2"])
        first.answered()  # of the last: 2 is not held up by 4
        wait("a call", lambda: desktop.held)
        desktop.answer_held()
        for sender in first, first, second:
            sender.answered()
        assert [each["title"] for each in desktop.shown[-2:]] == ["Bus", "Tram"] and len(desktop.standing) == 2
        first.close("1", "4", "no such")
        assert not desktop.standing
        first.post(notice("Tram", key="4", opens="nimbo://line?id=m:4"))
        number, owner = desktop.see("Tram"), session.owner()
        pid = session.ask("org.freedesktop.DBus", "/", "GetConnectionUnixProcessID", GLib.Variant("(s)", (NAME,)))
        assert "NoNewPrivs:\t1" in open(f"/proc/{pid.unpack()[0]}/status").read()

        # Others have no say in what the service shows.
        other, service = connect(session.address), desktop.bus.get_unique_name()
        for receiver in None, owner:
            other.emit_signal(receiver, "/org/freedesktop/DBus", "org.freedesktop.DBus", "NameOwnerChanged",
                              GLib.Variant("(sss)", (NOTIFICATIONS, service, "")))
            for signal, signature, value in ("ActionInvoked", "(us)", "default"), ("NotificationClosed", "(uu)", 2):
                other.emit_signal(receiver, desktop.path, NOTIFICATIONS, signal, GLib.Variant(signature, (number, value)))
        other.flush_sync(None)
        window = Application(session.address)
        for signal, signature, values in (("ActionInvoked", "(us)", (number, "other")), ("ActionInvoked", "(s)", "x"),
                                          ("ActionInvoked", "(us)", (number + 7, "default"))):
            desktop.say(signal, signature, *values)
        desktop.click(number, "a token")
        wait("opened", lambda: window.opened)
        assert window.opened == [(["nimbo://line?id=m:4"], dict.fromkeys(["activation-token", "desktop-startup-id"],
                                                                         "a token"))], window.opened
        window.leave()
        first.post(notice("Ferry", opens="nimbo://incident?id=8"))
        desktop.click(desktop.see("Ferry"), "another")
        session.opened(r"^-- nimbo://incident\?id=8 another\n$")

        # A number that is given again is another notification's.
        first.post(notice("Cable car", key="5"))
        desktop.next_id = desktop.see("Cable car")
        del desktop.standing[desktop.next_id]
        first.post(notice("Monorail", key="6"))
        first.close("5")
        assert desktop.titles() == ["Monorail"]
        first.close("6")

        # Another service knows nothing of what stood: nothing is told twice, nor replaced there.
        first.post(notice("Metro"))
        desktop.leave()
        desktop = NotificationService(session.address, capabilities=["body-markup"])
        second.post(notice("Metro")), second.post(notice("Funicular", body="a\nb <c>", opens="nimbo://?"))
        assert [fields(each)[:4] for each in desktop.shown] == [(1, 0, "Funicular – a b <c>", "")], desktop.shown
        assert not desktop.shown[0]["actions"] and session.owner() == owner

    with Session(installed=False) as session:
        desktop, sender = NotificationService(session.address), session.driver()
        sender.close("1")
        sender.post(notice(opens="nimbo://incident?id=7"))
        sender.post(notice(opens="nimbo://incident?id=7"))
        sender.post(notice("Few trains on 1", silent=True))
        assert [fields(each)[:3] for each in desktop.shown] == [(1, 0, "No trains on 1"), (1, 1, "Few trains on 1")]
        assert not desktop.shown[0]["actions"], "nobody is there for a click"
        sender.close("1")
        assert not desktop.standing


def try_faults():
    with Session() as session:
        sender = session.driver()
        sender.close(*map(str, range(5000)))
        assert not session.owner(), "nothing is started to take nothing away"
        sender.post(notice(), error=NO_SERVICE)
        for answer, first_id in ("s", 1), ("u", 0):
            desktop = NotificationService(session.address, answer=answer, first_id=first_id)
            sender.post(notice(), error=REFUSED)
            desktop.leave()
        desktop = NotificationService(session.address)
        for unfit in ([notice(key=str(number)) for number in range(51)], [notice(body="x" * 8_000_000)], [notice("")],
                      [notice(), notice()], [notice(opens="https://example.org")], [notice(isBroken=True)]):
            sender.post(*unfit, error=UNFIT)
        for count, body in (5000, ""), (1, "x" * 8_000_000):
            post = [(str(number), "t", body, 1, False, "") for number in range(count)]
            assert "Unfit" in session.refuses(GLib.Variant("(a(sssybs))", (post,)))
        assert "Unfit" in session.refuses(GLib.Variant("(a(sssybs))", ([("k", "t", "", 3, False, "")],)))
        assert "Unfit" in session.refuses(GLib.Variant("(a(sssybs))", ([("k", "t", "", 1, False, "file:///")],)))
        session.refuses(GLib.Variant("(s)", ("x",)))
        assert not desktop.shown
        for start in range(0, 200, 50):
            sender.post(*[notice(key=str(number)) for number in range(start, start + 50)])
        sender.post(notice(key="one more"), error=UNFIT)
        desktop.close(7)
        sender.post(notice(key="one more"))
        assert len(desktop.standing) == 200

    with Session() as session:
        desktop, keeper, sender = NotificationService(session.address), session.driver("serve"), session.driver()
        wait("a sender", session.owner)
        desktop.held = []
        sender.say(post=[notice()])
        wait("a call", lambda: desktop.held)
        keeper.say(advance=20)
        assert "does not answer" in keeper.hear()["problem"]
        sender.answered(NO_ANSWER)
        sender.say(post=[notice()])
        sender.say(close=["no such"])
        sender.answered()
        desktop.answer_held()
        sender.answered()
        assert len(desktop.shown) == 1, "what comes late is not asked for again"

        # It stays while a notice stands, and while a program is there that may ask again.
        sender.process.stdin.close()
        sender.process.wait()
        keeper.say(advance=100)
        third = session.driver()
        third.post(notice(), notice("Lift", key="2"))
        assert len(desktop.shown) == 2
        for title in desktop.titles():
            desktop.close(desktop.see(title))
        third.post(notice())
        keeper.say(advance=100)
        third.post(notice())
        assert len(desktop.shown) == 2
        assert session.driver("serve").hear()["problem"], "there is one"
        third.process.stdin.close()
        wait("the end", lambda: third.process.poll() is not None)
        wait("its end", lambda: not keeper.lines.empty() or keeper.say(advance=10) < 0)
        assert keeper.hear() == {"ended": True} and not session.owner()
        session.driver().post(notice())
        assert session.owner() and len(desktop.shown) == 3, "the bus starts the next one"

        silent = session.enter_context(socket.socket(socket.AF_UNIX))
        silent.bind(f"{session.folder}/silent")
        silent.listen()
        for address, error in ("unix:path=/dev/null", NO_BUS), (f"unix:path={session.folder}/silent", NO_ANSWER):
            sender = Driver(session, address)
            sender.say(post=[notice()])
            sender.say(advance=28)
            sender.answered(error)


{"shown": try_shown, "faults": try_faults}[sys.argv[1]]()
print("told")
