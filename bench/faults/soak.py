#!/usr/bin/env python3
"""One widget process through a great many update cycles of half an hour each, by virtual time: incidents begin and end,
appear and vanish, rows are opened up, the widget goes away and comes back. Prints its resident memory and its open
descriptors on the way, and fails when either grows.

Usage: soak.py BUILD_FOLDER [CYCLES]     1,000,000 cycles
"""
import datetime, os, sys, time

from city import LINES, City, entity, field, header, period, text

START = datetime.datetime(2026, 1, 5, 12, tzinfo=datetime.timezone.utc)
GROWTH_ALLOWED = 2 << 20  # bytes, from a tenth of the run on: the allocator's own ups and downs


FAVORITES = LINES[:6]


def lines_of(cycle, n):
    return [LINES[(cycle * 7 + n + k) % len(LINES)] for k in range(1 + cycle % 3)]


def is_affected(cycle):
    """Whether the first incident, the only one in force when the cycle's update ends, is of a favourite."""
    return cycle % 5 > 0 and any(line in FAVORITES for line in lines_of(cycle, 0))


def alerts(cycle, now):
    """Up to four incidents, the first in force, the others to come within the half hour; some are of several lines."""
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
    city = City(build)
    city.run("favorite", "add", *(f"city:{line}" for line in FAVORITES))
    widget = city.widget("--virtual-time", START.strftime("%Y-%m-%dT%H:%M:%SZ"))
    widget.appear()
    pid, begin, samples = widget.process.pid, time.monotonic(), []
    for cycle in range(1, cycles + 1):
        city.publish(alerts(cycle, int(START.timestamp()) + 1800 * cycle))
        if widget.call(("advanceTime", {"seconds": 1800}), "performUpdate")["updateResult"] != "newData":
            sys.exit(f"cycle {cycle}: the update failed")
        mode = "expanded" if is_affected(cycle) and cycle % 2 else "compact"
        if cycle % 7 == 0 or mode == "compact":
            widget.send(("setActiveDisplayMode", {"mode": mode}))
        if cycle % 100 == 0:
            widget.send("viewWillDisappear", "viewDidDisappear", "viewWillAppear", "viewDidAppear")
        if cycle % 49 == 0 and is_affected(cycle) == (widget.titles() == ["Good Service"]):
            sys.exit(f"cycle {cycle}: {widget.titles()}")
        if cycle % (cycles // 10) == 0:
            samples.append((resident(pid), descriptors(pid)))
            print(f"{cycle:8} cycles {time.monotonic() - begin:7.0f} s {samples[-1][0] / (1 << 20):7.2f} MiB resident "
                  f"{samples[-1][1]} descriptors", flush=True)
    if widget.close() != 0:
        sys.exit("the widget process failed at its end")
    if samples[-1][0] - samples[0][0] > GROWTH_ALLOWED or len({count for _, count in samples}) > 1:
        sys.exit("memory or descriptors grew")


if __name__ == "__main__":
    main()
