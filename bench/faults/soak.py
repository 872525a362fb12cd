#!/usr/bin/env python3
"""One widget process through a great many update cycles of half an hour each, by virtual time, with a server that has
other alerts in four of seven of them, and fails in one of eleven: incidents begin and end, appear and vanish, rows are
opened up, the widget goes away and comes back. Prints its resident memory, its open descriptors and what it wrote into
files on the way; fails when memory or descriptors grow.

Usage: soak.py BUILD_FOLDER [CYCLES]     1,000,000 cycles
"""
import datetime, os, sys, time

from city import LINES, City, Server, entity, field, header, period, text

START = datetime.datetime(2026, 1, 5, 12, tzinfo=datetime.timezone.utc)
GROWTH_ALLOWED = 2 << 20  # bytes, from a tenth of the run on: the allocator's own ups and downs


FAVORITES = LINES[:6]


def lines_of(cycle, n):
    return [LINES[(cycle * 7 + n + k) % len(LINES)] for k in range(1 + cycle % 3)]


def is_affected(published, cycle):
    """Whether an incident of those published then is in force on a favorite when this cycle's update ends."""
    passed = 1800 * (cycle - published)
    return any(600 * n - 300 <= passed <= 600 * n + 900 and any(line in FAVORITES for line in lines_of(published, n))
               for n in range(published % 5))


def alerts(cycle, now):
    """Up to four incidents, the first in force, the others to come within the hour; some are of several lines."""
    parts = [header(now)]
    for n in range(cycle % 5):
        selectors = b"".join(field(5, field(2, line)) for line in lines_of(cycle, n))
        texts = text(10, (f"Incident {cycle % 1000}.{n}", "en")) + text(11, (f"What it is about, {cycle}. " * (n + 1), "en"))
        parts.append(entity(f"{cycle}-{n}", period(now + 600 * n - 300, now + 600 * n + 900) + selectors + texts))
    return b"".join(parts)


def resident(pid):
    with open(f"/proc/{pid}/statm") as file:
        return int(file.read().split()[1]) * os.sysconf("SC_PAGE_SIZE")


def descriptors(pid):
    return len(os.listdir(f"/proc/{pid}/fd"))


def main():
    build, cycles = sys.argv[1], int(sys.argv[2]) if len(sys.argv) > 2 else 1000000
    server = Server()
    city = City(build, alerts=server.address, maximumAlertsAgeMinutes=24 * 60)
    city.run("favorite", "add", *(f"city:{line}" for line in FAVORITES))
    server.serve(alerts(0, int(START.timestamp())))
    widget = city.widget("--virtual-time", START.strftime("%Y-%m-%dT%H:%M:%SZ"))
    widget.appear()
    widget.call("performUpdate")
    pid, begin, samples, published = widget.process.pid, time.monotonic(), [], 0
    for cycle in range(1, cycles + 1):
        if cycle % 7 < 4:
            published = cycle
            server.serve(alerts(cycle, int(START.timestamp()) + 1800 * cycle))
        server.forgetful = cycle % 7 == 5  # the same bytes, sent again
        server.broken = cycle % 11 == 0
        widget.send(("advanceTime", {"seconds": 1800}))
        result = widget.call("performUpdate")["updateResult"]
        if result != ("failed" if server.broken else "newData"):
            sys.exit(f"cycle {cycle}: {result}")
        affected = not server.broken and is_affected(published, cycle)
        mode = "expanded" if affected and cycle % 2 else "compact"
        if cycle % 14 == 0 or mode == "compact":
            widget.send(("setActiveDisplayMode", {"mode": mode}))
        if cycle % 100 == 0:
            # The fetch that this begins ends before time goes on.
            widget.call("viewWillDisappear", "viewDidDisappear", "viewWillAppear", "viewDidAppear", "performUpdate")
        if cycle % 47 == 0 and not server.broken and affected == (widget.titles() == ["Good Service"]):
            sys.exit(f"cycle {cycle}: {widget.titles()}")
        if cycle % (cycles // 10) == 0:
            samples.append((resident(pid), descriptors(pid)))
            print(f"{cycle:8} cycles {time.monotonic() - begin:7.0f} s {samples[-1][0] / (1 << 20):7.2f} MiB resident "
                  f"{samples[-1][1]} descriptors {widget.written() / 1e6:9.1f} MB written", flush=True)
    if widget.close() != 0:
        sys.exit("the widget process failed at its end")
    if samples[-1][0] - samples[0][0] > GROWTH_ALLOWED or len({count for _, count in samples}) > 1:
        sys.exit("memory or descriptors grew")


if __name__ == "__main__":
    main()
