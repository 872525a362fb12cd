#!/usr/bin/env python3
"""Ends the widget process and its hosts with SIGKILL at random moments: while they save the last rows and change the
favourites, alone and two at a time. What is kept must then be the old state or the new one.

Usage: kill.py BUILD_FOLDER [KILLS [SEED]]     1000 kills; the seed makes a run's moments the same again
"""
import glob, random, sys, time

from city import LINES, City, entity, header, titled


def change(favorites, chance):
    """Arguments of a change of the favourites, and what they are after it."""
    others = [line for line in LINES if line not in favorites]
    kind = chance.choice([k for k, may in (("add", others), ("remove", favorites), ("move", favorites)) if may])
    if kind == "add":
        added = chance.sample(others, chance.randint(1, len(others)))
        return [kind, *(f"city:{line}" for line in added)], favorites + added
    line = chance.choice(favorites)
    rest = [other for other in favorites if other != line]
    if kind == "remove":
        return [kind, f"city:{line}"], rest
    place = chance.randrange(len(favorites))
    return [kind, f"city:{line}", str(place + 1)], rest[:place] + [line] + rest[place:]


class Round:
    def __init__(self, build, seed):
        self.chance = random.Random(seed)
        self.city = City(build)
        self.favorites = LINES[:5]
        self.title = "Works 0"
        self.number = 0
        self.kills = self.kept = 0
        self.city.run("favorite", "add", *(f"city:{line}" for line in self.favorites))
        self.host_seconds = self.seconds_of(lambda: self.city.run("favorite", "list"))
        self.widget_seconds = self.seconds_of(lambda: self.save(self.title).close())

    @staticmethod
    def seconds_of(work):
        begin = time.monotonic()
        work()
        return time.monotonic() - begin

    def save(self, title):
        """A widget process on its way to show this title and to keep it."""
        self.city.publish(header() + entity("a", titled(title)))
        widget = self.city.widget()
        sizes = {"compact": [359, 110], "expanded": [359, 440]}
        widget.send(("initialize", {"locale": "en", "displayModes": sizes}), "loadView", "viewWillAppear",
                    "viewDidAppear", "performUpdate")
        return widget

    def kill(self, process, moment):
        time.sleep(max(0, moment - time.monotonic()))
        process.kill()
        process.wait()
        self.kills += 1

    def moment(self, seconds):
        return time.monotonic() + self.chance.uniform(0, 1.2 * seconds)

    def kill_host(self, second_host):
        arguments, after = change(self.favorites, self.chance)
        host = self.city.start("favorite", *arguments)
        moment = self.moment(self.host_seconds)
        other = self.city.start("settings", "set", "kill.other", str(self.number)) if second_host else None
        self.kill(host, moment)
        if other and other.wait() != 0:
            sys.exit("a host failed because another one was killed")
        now = self.city.favorites()
        if now not in (self.favorites, after):
            sys.exit(f"favorite {' '.join(arguments)}: {self.favorites} became {now}")
        self.kept += now == after != self.favorites
        self.favorites = now

    def kill_widget(self):
        title = f"Works {self.number}"
        widget = self.save(title)
        title = title if self.favorites else "No Favorite Lines"
        if self.chance.random() < 0.7:  # close to the saving
            self.wait_for_update(widget)
            moment = self.moment(self.host_seconds / 4)
        else:
            moment = self.moment(self.widget_seconds)
        widget.send("viewWillDisappear", "viewDidDisappear")
        self.kill(widget.process, moment)
        widget.process.stdout.close()
        restored = self.restored_title()
        if restored not in (self.title, title):
            sys.exit(f"the rows kept are {restored!r}, neither {self.title!r} nor {title!r}")
        self.kept += restored == title
        self.title = restored

    @staticmethod
    def wait_for_update(widget):
        for line in widget.process.stdout:
            if b"updateResult" in line:
                return

    def restored_title(self):
        widget = self.city.widget()
        sizes = {"compact": [359, 110], "expanded": [359, 440]}
        widget.call(("initialize", {"locale": "en", "displayModes": sizes}), "loadView")
        title = widget.titles()[0]
        widget.close()
        return title

    def run(self, kills):
        self.prepare_rows()
        while self.kills < kills:
            self.number += 1
            kind = self.chance.choice(["host", "two hosts", "widget"])
            if kind == "widget":
                self.kill_widget()
            else:
                self.kill_host(kind == "two hosts")
            if self.city.favorites() != self.favorites:
                sys.exit(f"the favourites changed by themselves from {self.favorites}")
        if broken := glob.glob(self.city.folder + "/state/*broken*"):
            sys.exit(f"a database broke: {broken}")
        print(f"{self.kills} kills: {self.kept} left the new state, the others the old one; nothing else was found")

    def prepare_rows(self):
        widget = self.save(self.title)
        self.wait_for_update(widget)
        widget.call("viewWillDisappear", "viewDidDisappear")
        widget.close()


def main():
    arguments = sys.argv[1:]
    kills = int(arguments[1]) if len(arguments) > 1 else 1000
    seed = int(arguments[2]) if len(arguments) > 2 else random.randrange(1 << 32)
    print(f"seed {seed}", flush=True)
    Round(arguments[0], seed).run(kills)


main()
