"""Updates of a widget on screen, end to end: the widget process asks a server on loopback, as it does all day.

What counts is the processor time of the widget process, on all its threads, and what it writes into files. The peers
are processes that stay too (peers/BareUpdate.cpp), and ask the same server.
"""

import functools
import json
import os
import pathlib
import subprocess
import sys
import tempfile
import time

sys.path.insert(0, str(pathlib.Path(__file__).parent / "faults"))
from city import Server, Widget, entity, field, header, period, text  # noqa: E402

FAVORITES = [f"R{n * 200}" for n in range(20)]
ROUTES = 5000
ALERTS = 5000
DAY = 86400


def sentences(about, size):
    words = f"Because of {about} trains run at a lower frequency between Northgate and Old Docks. "
    return (words * (size // len(words) + 1))[:size]


def alert(number, routes, in_force, size=300, change=""):
    selectors = b"".join(field(5, field(1, f"A{route % 10}") + field(2, f"R{route}")) for route in routes)
    texts = [text(n, (english, "en"), (german, "de")) for n, english, german in (
        (8, f"https://example.org/en/{number}", f"https://example.org/de/{number}"),
        (10, f"Delays after works, number {number}{change}", f"Verzögerungen, Nummer {number}{change}"),
        (11, sentences(f"works of number {number}", size), sentences(f"Bauarbeiten der Nummer {number}", size)))]
    return entity(f"alert-{number}", in_force + selectors + field(6, 9) + field(7, 3) + b"".join(texts))


def of_others(number):
    """A route that is no favorite."""
    route = number % ROUTES
    return route + 1 if route % 200 == 0 else route


class BusyFeed:
    """5000 alerts, 200 of them on the 20 favorites; `begin` and `end` say when those few that change the rows of a day
    are in force."""

    def __init__(self, now):
        self.now = now
        always = period(now - 3600, now + 30 * DAY)
        self.entities = []
        for n in range(ALERTS):
            in_force = always
            if n < 3:
                in_force = period(now + 3600 * (n + 1), now + 30 * DAY)
            elif n < 6:
                in_force = period(now - 3600, now + 3600 * (n + 1))
            routes = [n // 10 * 200] if n < 200 else [of_others(n), of_others(n * 7 + 1), of_others(n * 31 + 5)]
            self.entities.append(alert(n, routes, in_force))
        self.always = always

    def body(self, change=0):
        """Another one for each number, by one alert of a favorite."""
        entities = list(self.entities)
        entities[100] = alert(100, [2000], self.always, change=f" ({change})" if change else "")
        return header(self.now) + b"".join(entities)


def processor_seconds(pid):
    """What all threads of a process have had. Source: clock_getcpuclockid(3)."""
    return time.clock_gettime(~pid << 3 | 2)


def proportional_mib(pid):
    """The resident memory of a process, with its share of what it shares with others."""
    with open(f"/proc/{pid}/smaps_rollup") as file:
        return next(int(line.split()[1]) for line in file if line.startswith("Pss:")) / 1024


class Peer:
    def __init__(self, program):
        self.process = subprocess.Popen([program], stdin=subprocess.PIPE, stdout=subprocess.PIPE, text=True)

    def seconds(self, *words):
        begin = processor_seconds(self.process.pid)
        self.process.stdin.write(" ".join(map(str, words)) + "\n")
        self.process.stdin.flush()
        if self.process.stdout.readline() != "done\n":
            sys.exit(f"bench: {words}: the peer failed")
        return processor_seconds(self.process.pid) - begin


class Day:
    UPDATES = 10  # in one figure
    SETTLED = 2  # seconds after which a bar has given back what its rows took

    def __init__(self, build, folder):
        self.build, self.folder = build, folder

    @functools.cached_property
    def server(self):
        return Server()

    @functools.cached_property
    def feed(self):
        return BusyFeed(int(time.time()))

    @functools.cached_property
    def peer(self):
        return Peer(self.build / "bench/nimbo-bare-update")

    def folders(self, alerts=None):
        """Arguments of a state whose favorites are on the feed of `alerts`, the server's without."""
        home = pathlib.Path(tempfile.mkdtemp(dir=self.folder))
        arguments = ["--config", str(home / "config"), "--state", str(home / "state")]
        (home / "config").mkdir()
        feed = {"name": "metro", "static": str(self.folder / "feed"), "alerts": str(alerts or self.server.address),
                "maximumAlertsAgeMinutes": 60 * 24 * 3}
        (home / "config/feeds.json").write_text(json.dumps({"feeds": [feed]}))
        subprocess.run([self.build / "src/host/nimbo-transit", *arguments, "favorite", "add",
                        *(f"metro:{line}" for line in FAVORITES)], check=True, stdout=subprocess.DEVNULL)
        return arguments

    def widget(self, *arguments):
        """One on screen after its first update, with 200 rows."""
        widget = Widget([self.build / "src/process/nimbo-transit-widget", *self.folders(), *arguments])
        sizes = {"compact": [359, 110], "expanded": [359, 110 * 300]}
        widget.call(("initialize", {"locale": "en", "displayModes": sizes}), "loadView", "viewWillAppear",
                    "viewDidAppear")
        self.update(widget)
        widget.call(("setActiveDisplayMode", {"mode": "expanded"}))
        return widget

    @staticmethod
    def update(widget):
        answer = widget.call("performUpdate")
        if answer["updateResult"] != "newData":
            sys.exit(f"bench: {answer['reason']}")

    @functools.cached_property
    def on_screen(self):
        self.server.serve(self.feed.body())
        return self.widget()

    def updates(self, forgetful=False, changes=False):
        """Processor time and bytes written of one update."""
        widget, server = self.on_screen, self.server
        self.update(widget)
        server.forgetful = forgetful
        begin, written = processor_seconds(widget.process.pid), widget.written()
        for _ in range(self.UPDATES):
            if changes:
                server.serve(self.feed.body(server.number))
            self.update(widget)
        server.forgetful = False
        return ((processor_seconds(widget.process.pid) - begin) / self.UPDATES,
                (widget.written() - written) / self.UPDATES)

    def unchanged_peer(self):
        self.server.serve(self.feed.body())
        return self.peer.seconds("ask", self.server.address, self.server.etag)

    def same_peer(self):
        self.server.serve(self.feed.body())
        return self.peer.seconds("get", self.server.address)

    @functools.cached_property
    def file(self):
        path = self.folder / "busy.pb"
        path.write_bytes(self.feed.body())
        self.peer.seconds("parse", path)  # reads the file
        return path

    def parse_peer(self):
        return self.peer.seconds("parse", self.file)

    @functools.cached_property
    def whole_day(self):
        """1440 updates in virtual time, of which 20 bring other alerts, while six incidents begin or end."""
        now = self.feed.now
        self.server.serve(self.feed.body())
        widget = self.widget("--virtual-time", time.strftime("%Y-%m-%dT%H:%M:%SZ", time.gmtime(now)))
        begin, written = processor_seconds(widget.process.pid), widget.written()
        for minute in range(1440):
            if minute % 72 == 36:
                self.server.serve(self.feed.body(minute))
            widget.call(("advanceTime", {"seconds": 60}))
            self.update(widget)
        widget.call("viewWillDisappear", "viewDidDisappear")
        figures = processor_seconds(widget.process.pid) - begin, (widget.written() - written) / 1e6
        widget.close()
        return figures

    def growth(self):
        """Memory after 1000 updates, of which every tenth brings another answer, beside that after the tenth."""
        self.server.serve(self.feed.body())
        widget = self.widget()
        figures = []
        for count in range(1, 1001):
            if count % 10 == 0:
                self.server.serve(self.feed.body(count))
            self.update(widget)
            if count in (10, 1000):
                figures.append(proportional_mib(widget.process.pid))
        widget.close()
        return figures[1] / figures[0]

    def status_bar(self):
        """Of the bar's program and its widget process, once the rows are there."""
        self.server.serve(self.feed.body())
        bar = subprocess.Popen([self.build / "src/host/nimbo-transit", *self.folders(), "status", "--waybar", "--watch"],
                               stdout=subprocess.PIPE, text=True)
        while "Advisories" not in bar.stdout.readline():
            pass
        time.sleep(self.SETTLED)
        with open(f"/proc/{bar.pid}/task/{bar.pid}/children") as file:
            processes = [bar.pid, *map(int, file.read().split())]
        total = sum(map(proportional_mib, processes))
        bar.terminate()
        bar.wait()
        return total

    def bare_pair(self):
        """Of two programs with nothing but the libraries."""
        address = self.server.address
        programs = [subprocess.Popen([self.build / "bench" / name, self.folder / "bare.sqlite", address],
                                     stdin=subprocess.PIPE, stdout=subprocess.PIPE, text=True)
                    for name in ("nimbo-bare-bar", "nimbo-bare-bar-fetching")]
        for program in programs:
            program.stdout.readline()
        total = sum(proportional_mib(program.pid) for program in programs)
        for program in programs:
            program.stdin.close()
            program.wait()
        return total

    def hostile(self, size):
        """Arguments of a state with 1049 alerts on the favorites, each of so many bytes of text."""
        now = self.feed.now
        path = self.folder / f"hostile-{size}.pb"
        if not path.exists():
            path.write_bytes(header(now) + b"".join(
                alert(n, [n % 20 * 200], self.feed.always, size // 2) for n in range(1049)))
        return self.folders(path)

    @functools.cached_property
    def saved_status(self):
        """The command that shows the rows of the last time."""
        arguments = self.folders(self.file)
        program = str(self.build / "src/host/nimbo-transit")
        subprocess.run([program, *arguments, "update"], check=True)
        return [program, *arguments, "status", "--saved"]


def seconds_of(command):
    begin = time.monotonic()
    if subprocess.run(command, stdout=subprocess.DEVNULL).returncode != 0:
        sys.exit(f"bench: {' '.join(command)} failed")
    return time.monotonic() - begin


def fresh_clone(top, folder):
    """From a clone to the rows, with the packages installed and no compiler cache."""
    clone = folder / "clone"
    subprocess.run(["git", "clone", "-q", top, clone], check=True)
    begin = time.monotonic()
    subprocess.run([clone / "run", "status"], check=True, stdout=subprocess.DEVNULL, stderr=subprocess.DEVNULL,
                   env=dict(os.environ, CCACHE_DISABLE="1"))
    return time.monotonic() - begin
