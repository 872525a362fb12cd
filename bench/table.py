"""Measures every row beside its peer, turn by turn, and prints one table of ratios.

    table.py BUILD [--pairs N] [--rows WORD]

A pair is one run of each side, one right after the other, the sides changing places from pair to pair. A row's figure
is the median of its pairs' ratios; the spread is the middle half of them. One pair before them, which warms the caches, does
not count. Rows without a peer are in their own unit.
Functions are measured in processor time, which other programs disturb less; processes on the clock.
"""

import argparse
import contextlib
import json
import os
import pathlib
import shutil
import sqlite3
import statistics
import subprocess
import sys
import tempfile
import time

from day import Day, fresh_clone, seconds_of

FAVORITES = 20
PAIR_SECONDS = 0.15  # that a function runs for in one pair


class Row:
    """One row: `measure` and `measure_peer` answer a figure each; without a peer the figure counts itself. `compare` is
    what a pair makes of both, their ratio unless it says otherwise. What takes minutes is measured `once`."""

    def __init__(self, name, aim, measure, measure_peer=None, unit="", peer="-", shown=("ms", 1e3),
                 compare=lambda ours, theirs: ours / theirs, once=False):
        self.name, self.aim, self.unit, self.peer = name, aim, unit, peer
        self.measure, self.measure_peer, self.shown = measure, measure_peer, shown
        self.compare, self.once = compare, once

    def figures(self, pairs):
        figures, ours, theirs = [], [], []
        if self.once:
            return [self.measure()], "once"
        for measure in filter(None, (self.measure, self.measure_peer)):
            measure()
        for number in range(pairs):
            if not self.measure_peer:
                figures.append(self.measure())
                continue
            sides = [(self.measure, ours), (self.measure_peer, theirs)]
            for measure, values in sides if number % 2 == 0 else reversed(sides):
                values.append(measure())
            figures.append(self.compare(ours[-1], theirs[-1]))
        if not theirs:
            return figures, f"lowest {min(figures):.3g} {self.unit}"
        unit, scale = self.shown
        return figures, f"{statistics.median(ours) * scale:.3g} : {statistics.median(theirs) * scale:.3g} {unit}"

    def line(self, pairs):
        figures, note = self.figures(pairs)
        median = statistics.median(figures)
        low, _, high = statistics.quantiles(figures, n=4) if len(figures) > 1 else figures * 3
        verdict = "-" if self.aim is None else "met" if median <= self.aim else "missed"
        aim = "-" if self.aim is None else f"{self.aim:g} {self.unit}".strip()
        spread = f"{low:.3g} to {high:.3g}"
        figure = f"{median:.3g} {self.unit}".strip()
        return f"| {self.name} | {self.peer} | {figure} | {spread} | {aim} | {verdict} | {note} |"


def run(*command, **options):
    done = subprocess.run([str(word) for word in command], capture_output=True, text=True, **options)
    if done.returncode != 0:
        sys.exit(f"bench: {command[0]}: {done.stderr.strip() or done.stdout.strip()}")
    return done.stdout


class Bench:
    def __init__(self, build, folder):
        self.build, self.folder = build, folder
        self.day = Day(build, folder)
        self.widget = build / "src/process/nimbo-transit-widget"
        self.environment = dict(os.environ, GSETTINGS_BACKEND="memory", NO_AT_BRIDGE="1", GTK_A11Y="none")

    # Functions: Google Benchmark, one of them at a time.

    def function(self, name):
        def measure():
            report = json.loads(run(self.build / "bench/nimbo-bench", f"--benchmark_filter=^{name}$",
                                    f"--benchmark_min_time={PAIR_SECONDS}", "--benchmark_format=json"))
            result = report["benchmarks"][0]
            if result.get("error_occurred"):
                sys.exit(f"bench: {name}: {result['error_message']}")
            scale = {"ns": 1e-9, "us": 1e-6, "ms": 1e-3}[result["time_unit"]]
            return result["real_time" if "manual_time" in result["name"] else "cpu_time"] * scale
        return measure

    def pair(self, name):
        return self.function(name), self.function(name + "Peer")

    def timed(self, name, scale):
        measure = self.function(name)
        return lambda: measure() * scale

    # Whole processes.

    def process(self, key, *arguments, scale=1):
        def measure():
            report = json.loads(run(self.build / "bench/nimbo-bench-process", *arguments, env=self.environment))
            return report[key] * scale
        return measure

    def requests(self, name, *methods):
        path = self.folder / name
        modes = {"compact": [359, 110], "expanded": [359, 660]}
        initialize = {"locale": "en", "displayModes": modes, "activeDisplayMode": "expanded"}
        lines = [("initialize", initialize), *methods]
        text = "".join(json.dumps({"jsonrpc": "2.0", "id": number, "method": method, "params": params}) + "\n"
                       for number, (method, params) in enumerate(lines, 1))
        path.write_text(text)
        return path, f'"id":{len(lines)},'

    def prepare(self):
        """A state with saved rows, the same rows for the bare program, and a large feed."""
        state = self.folder / "state"
        arguments = ["--config", self.folder / "config", "--state", state]
        appear = [("loadView", {}), ("performUpdate", {}), ("setActiveDisplayMode", {"mode": "expanded"}),
                  ("snapshot", {}), ("viewWillAppear", {}),
                  ("viewWillDisappear", {}), ("viewDidDisappear", {}), ("shutdown", {})]
        output = self.converse(arguments, appear)
        snapshot = next(message["result"] for message in output if "rows" in message.get("result", {}))
        with sqlite3.connect(self.folder / "bare.sqlite") as database:
            database.execute("PRAGMA journal_mode = WAL")
            database.execute("CREATE TABLE rows (title, text, shield, color)")
            for row in snapshot["rows"]:
                shield = ((row.get("artwork") or {}).get("shield")) or {}
                color = int((shield.get("color") or "#000000")[1:], 16)
                database.execute("INSERT INTO rows VALUES (?, ?, ?, ?)",
                                 (row["primaryText"], row["secondaryText"], shield.get("text"), color))
        self.arguments = arguments
        run(self.build / "bench/nimbo-bench-feed", self.folder / "feed")
        self.large = ["--config", self.folder / "large", "--state", self.folder / "large"]
        program = self.build / "src/host/nimbo-transit"
        run(program, *self.large, "feed", "add", "metro", "--static", self.folder / "feed", "--alerts",
            self.folder / "feed/alerts.pb", "--force")
        for number in range(FAVORITES):
            run(program, *self.large, "favorite", "add", f"metro:R{number * 200}")

    def converse(self, arguments, methods):
        path, last = self.requests("prepare", *methods)
        child = subprocess.Popen([str(word) for word in [self.widget, *arguments]], stdin=subprocess.PIPE,
                                 stdout=subprocess.PIPE, text=True)
        messages = []
        for request in path.read_text().splitlines():
            child.stdin.write(request + "\n")
            child.stdin.flush()
            wanted = json.loads(request)["id"]
            while True:
                message = json.loads(child.stdout.readline())
                messages.append(message)
                if message.get("id") == wanted and "method" not in message:
                    break
        child.wait()
        return messages

    def desktop_rows(self, desktop):
        layer = [self.build / "src/host/layer/nimbo-transit-layer", *self.arguments]
        bare = [self.build / "bench/nimbo-bare-layer"]
        memory = desktop.folder + "/picture"
        pathlib.Path(memory).touch()
        bare_widget = [self.build / "bench/nimbo-bare-widget", self.folder / "bare.sqlite", memory]
        share, shown = desktop.share(layer), ("MiB", 1)
        return [
            Row("the desktop's first frame", 1.25, desktop.first_frame(*layer), desktop.first_frame(*bare),
                peer="bare layer-shell client, one text through Pango"),
            Row("the desktop's memory, host and widget process (PSS)", 1.3, share, desktop.share(bare, bare_widget),
                peer="two bare programs", shown=shown),
            Row("the same beside mako with a notification", None, share, desktop.share(["mako"], notify=True),
                peer="mako", shown=shown),
            Row("the same beside dunst with a notification", None, share, desktop.share(["dunst"], notify=True),
                peer="dunst", shown=shown),
        ]

    def rows(self):
        first, drawn = self.requests("first", ("loadView", {}), ("render", {}))
        # The descriptor of the memory that the measuring program hands on.
        draws = [self.widget, "--pictures", 3]
        start = ["--input", first, "--until", drawn, "--", *draws, *self.arguments]
        bare = ["--until", "drawn", "--", self.build / "bench/nimbo-bare-widget", self.folder / "bare.sqlite",
                "@PICTURE@"]
        update, updated = self.requests("update", ("loadView", {}), ("performUpdate", {}),
                                        ("render", {}))
        loaded = ["--input", update, "--until", updated.replace("4", "3", 1), "--", *draws]
        window = ["--frame", "--", self.build / "src/host/window/nimbo-transit-desktop", *self.arguments]
        bare_window = ["--frame", "--", self.build / "bench/nimbo-bare-window"]
        mib = 1 / 1024
        memory = ("MiB", mib)
        bare_rows = "bare program: SQLite, Pango, Cairo"
        return [
            Row("widget process, start to first pixels, saved rows", 1.25, self.process("seconds", *start),
                self.process("seconds", *bare), peer=bare_rows),
            Row("its peak resident memory before the first fetch", 24, self.process("peakKiB", *start, scale=mib),
                unit="MiB"),
            Row("the same beside the bare program", None, self.process("peakKiB", *start),
                self.process("peakKiB", *bare), peer=bare_rows, shown=memory),
            Row("its private dirty memory before the first fetch", 4,
                self.process("privateDirtyKiB", *start, scale=mib), unit="MiB"),
            Row("the same beside the bare program", None, self.process("privateDirtyKiB", *start),
                self.process("privateDirtyKiB", *bare), peer=bare_rows, shown=memory),
            Row("its peak resident memory, sample city loaded", 24,
                self.process("peakKiB", *loaded, *self.arguments, scale=mib), unit="MiB"),
            Row("its peak resident memory, 5000 routes and 5 MB of alerts loaded", 24,
                self.process("peakKiB", *loaded, *self.large, scale=mib), unit="MiB"),
            Row("redraw of six rows, nothing changed", 1.5, *self.pair("redraw"), peer="bare Pango and Cairo"),
            Row("layout of six rows after a changed constant", 16.7, self.timed("layOut", 1e3), unit="ms"),
            Row("decode of the hand-off record", 0.7, *self.pair("decode"), peer="libprotobuf, fresh message"),
            Row("encode of the hand-off record", 1.0, *self.pair("encode"), peer="libprotobuf, built message"),
            Row("alerts feed of 5 MB and 5000 alerts to the incidents of 20 favorites", 0.25,
                self.function("alerts/manual_time"), self.function("alertsPeer"),
                peer="libprotobuf lite, parse alone"),
            Row("static feed of 5000 routes, from cache", 0.05, *self.pair("staticFeedFromCache"),
                peer="libcsv, reading routes.txt"),
            Row("rebuild, 20 lines with 10 incidents each, all shared by two", 0.2,
                self.timed("rebuild/shared/20/10", 1e3), unit="ms"),
            Row("rebuild, 500 lines with 20 incidents each, all shared by two", 16.7,
                self.timed("rebuild/shared/500/20", 1e3), unit="ms"),
            Row("rebuild, 500 lines with 20 incidents each, none shared", 16.7,
                self.timed("rebuild/alone/500/20", 1e3), unit="ms"),
            Row("growth of a rebuild from 50 lines to 500, all shared by two (linear: 10)", None,
                self.function("rebuild/shared/500/20"),
                self.function("rebuild/shared/50/20"), peer="the same of 50 lines"),
            Row("equality of two equal list items of 20 rows", 5, self.timed("equality/20", 1e6), unit="µs"),
            Row("one cell's constraints solved from nothing", 1.0, *self.pair("solveCell"),
                peer="python3-kiwisolver's C++ solver"),
            Row("one constant changed", 1.0, *self.pair("changeConstant"), peer="python3-kiwisolver's C++ solver"),
            Row("save and restore of the view state, 20 lines", 1.2, *self.pair("saveAndRestore"),
                peer="nlohmann CBOR of the same content"),
            Row("the window's first frame", 0.6, self.process("seconds", *window),
                self.process("seconds", *bare_window), peer="plain gtkmm window"),
            Row("the window's resident memory", 40, self.process("residentKiB", *window, scale=mib), unit="MiB"),
            Row("the same beside the plain window", None, self.process("residentKiB", *window),
                self.process("residentKiB", *bare_window), peer="plain gtkmm window", shown=memory),
            *self.rows_of_the_day(loaded),
        ]

    def rows_of_the_day(self, loaded):
        day = self.day
        more = {"unit": "ms more", "compare": lambda ours, theirs: (ours - theirs) * 1e3}
        seconds, written = 0, 1
        hostile, usual = (lambda size=size: self.process("seconds", *loaded, *day.hostile(size))()
                          for size in (20000, 200))
        return [
            Row("update answered 304, 4.3 MB of alerts, 20 favorites, 200 rows", 1, lambda: day.updates()[seconds],
                day.unchanged_peer, peer="libcurl alone, new handle and connection", **more),
            Row("update answered 304: bytes written", 100, lambda: day.updates()[written], unit="bytes"),
            Row("update answered 200 with the same bytes", 2, lambda: day.updates(forgetful=True)[seconds],
                day.same_peer, peer="libcurl receiving them, and a hash over them", **more),
            Row("update answered 200 with the same bytes: bytes written", 100,
                lambda: day.updates(forgetful=True)[written], unit="bytes"),
            Row("update with one alert changed of 5000", 0.5, lambda: day.updates(changes=True)[seconds],
                day.parse_peer, peer="libprotobuf lite, parse alone"),
            Row("update with one alert changed of 5000: bytes written", None,
                lambda: day.updates(changes=True)[written], unit="bytes"),
            Row("day on screen: 1440 updates, 20 of them changed, 6 starts and ends", 5,
                lambda: day.whole_day[seconds], unit="s", once=True),
            Row("day on screen: written", 100, lambda: day.whole_day[written], unit="MB", once=True),
            Row("memory (PSS) after 1000 updates, beside the tenth", 1.02, day.growth, once=True),
            Row("status bar and its widget process after a fetch: PSS", 1.3, day.status_bar, day.bare_pair,
                peer="two bare programs: GLib, SQLite; with libcurl, ICU", shown=("MiB", 1)),
            Row("nimbo-transit status --saved, to its end", 1.2, lambda: seconds_of(day.saved_status),
                lambda: seconds_of(["/usr/bin/python3", "-c", "pass"]), peer="python3 -c pass"),
            Row("1049 alerts of 20 KB on the favorites, first rows", 1.5, hostile, usual,
                peer="the same of 200 bytes"),
            Row("fresh clone, packages installed, to the rows of ./run status, no compiler cache", 180,
                lambda: fresh_clone(pathlib.Path(__file__).resolve().parent.parent, self.folder), unit="s", once=True),
        ]


NOTIFY = ["gdbus", "call", "--session", "--dest=org.freedesktop.Notifications",
          "--object-path=/org/freedesktop/Notifications", "--method=org.freedesktop.Notifications.Notify", "bench", "0", "",
          "Delays of up to 15 minutes", "After works between two stations.", "[]", "{}", "60000"]


class Desktop(contextlib.ExitStack):
    """What stands on a Wayland desktop: first frames on a compositor that does nothing else, memory on sway."""

    SETTLED = 2  # seconds after which a program has said what it has to say
    NOBODY = 65534  # sway refuses to be root

    def __init__(self, build):
        super().__init__()
        self.folder = self.enter_context(tempfile.TemporaryDirectory())
        somebody = {}
        if os.getuid() == 0:
            somebody = {"user": self.NOBODY, "group": self.NOBODY, "extra_groups": []}
            os.chown(self.folder, self.NOBODY, self.NOBODY)
        self.environment = dict(os.environ, XDG_RUNTIME_DIR=self.folder, HOME=self.folder, WLR_BACKENDS="headless",
                                WLR_RENDERER="pixman", WLR_LIBINPUT_NO_DEVICES="1")
        self.environment.pop("DISPLAY", None)
        self.compositor = self.start(build / "bench/nimbo-bench-compositor", "wp_fractional_scale_manager_v1", text=True,
                                     stdin=subprocess.PIPE, stdout=subprocess.PIPE)
        self.own = self.compositor.stdout.readline().strip()
        bus = self.start("dbus-daemon", "--session", "--nofork", "--print-address=1", stdout=subprocess.PIPE, text=True)
        self.environment["DBUS_SESSION_BUS_ADDRESS"] = bus.stdout.readline().strip()
        config = pathlib.Path(self.folder, "config")
        config.write_text("xwayland disable\n")
        self.start("sway", "-c", config, stderr=subprocess.DEVNULL, **somebody)
        while not (names := set(os.listdir(self.folder)) & {"wayland-0", "wayland-1"} - {self.own}):
            time.sleep(0.1)
        self.sway = names.pop()

    def start(self, *command, **options):
        child = subprocess.Popen([str(word) for word in command], env=self.environment, **options)
        self.callback(child.wait)
        self.callback(child.kill)
        return child

    def first_frame(self, *command):
        """Seconds from the start of a program to its first picture."""
        words, environment = [str(word) for word in command], dict(self.environment, WAYLAND_DISPLAY=self.own)

        def measure():
            begin = time.perf_counter()
            child = subprocess.Popen(words, env=environment)
            while not self.compositor.stdout.readline().startswith("shown"):
                pass
            seconds = time.perf_counter() - begin
            child.terminate()
            child.wait()
            while not self.compositor.stdout.readline().startswith("closed"):
                pass
            return seconds
        return measure

    def share(self, *commands, notify=False):
        """MiB that programs and those that they started take, what they share with others divided among all."""
        environment = dict(self.environment, WAYLAND_DISPLAY=self.sway)

        def measure():
            children = [subprocess.Popen([str(word) for word in command], env=environment, stdin=subprocess.PIPE,
                                         stdout=subprocess.DEVNULL) for command in commands]
            time.sleep(self.SETTLED)
            if notify:
                subprocess.run(NOTIFY, env=environment, check=True, stdout=subprocess.DEVNULL)
                time.sleep(self.SETTLED)
            started = subprocess.run(["pgrep", "-P", ",".join(str(child.pid) for child in children)],
                                     capture_output=True, text=True).stdout.split()
            total = 0
            for pid in [*started, *(child.pid for child in children)]:
                with open(f"/proc/{pid}/smaps_rollup") as rollup:
                    total += sum(int(line.split()[1]) for line in rollup if line.startswith("Pss:"))
            for child in children:
                child.terminate()
                child.wait()
            return total / 1024
        return measure


class Display:
    """An X server of its own for the windows."""

    def __enter__(self):
        read, write = os.pipe()
        self.server = subprocess.Popen(["Xvfb", "-displayfd", str(write), "-screen", "0", "1280x1024x24", "-nolisten",
                                        "tcp"], pass_fds=[write], stderr=subprocess.DEVNULL)
        os.close(write)
        with os.fdopen(read) as number:
            os.environ["DISPLAY"] = ":" + number.readline().strip()
        os.environ.pop("WAYLAND_DISPLAY", None)
        return self

    def __exit__(self, *_):
        self.server.terminate()
        self.server.wait()


def main():
    parser = argparse.ArgumentParser()
    parser.add_argument("build", type=pathlib.Path)
    parser.add_argument("--pairs", type=int, default=15)
    parser.add_argument("--rows", default="", help="only rows whose name holds this")
    arguments = parser.parse_args()
    folder = pathlib.Path(tempfile.mkdtemp(prefix="nimbo-bench-"))
    try:
        with Display(), Desktop(arguments.build.resolve()) as desktop:
            bench = Bench(arguments.build.resolve(), folder)
            bench.prepare()
            print("| row | peer | median | spread | aim | | ours : the peer's |\n|---|---|---|---|---|---|---|")
            for row in bench.rows() + bench.desktop_rows(desktop):
                if arguments.rows in row.name:
                    print(row.line(arguments.pairs), flush=True)
    finally:
        shutil.rmtree(folder)


main()
