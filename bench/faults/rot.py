#!/usr/bin/env python3
"""Lets the files of the state rot: flips bits, zeroes and swaps sectors, writes nonsense, cuts files short; as they are
at rest, and as a killed widget process leaves them. The favorites must then all be there, or be said to be damaged;
what is left can be changed, and what was lost be added again.

Usage: rot.py BUILD_FOLDER [TIMES [SEED]]     1000 times; the seed makes a run the same again
"""
import collections, os, random, shutil, sys

from city import LINES, City

SECTOR = 512


def flip(chance, data):
    at = chance.randrange(len(data))
    data[at] ^= 1 << chance.randrange(8)


def zero(chance, data):
    at = chance.randrange((len(data) + SECTOR - 1) // SECTOR) * SECTOR
    data[at:at + SECTOR] = bytes(len(data[at:at + SECTOR]))


def scribble(chance, data):
    at = chance.randrange(len(data))
    count = min(chance.randint(2, 64), len(data) - at)
    data[at:at + count] = chance.randbytes(count)


def swap(chance, data):
    first, second = (chance.randrange(len(data) // SECTOR) * SECTOR for _ in range(2))
    one, other = data[first:first + SECTOR], data[second:second + SECTOR]
    data[first:first + SECTOR], data[second:second + SECTOR] = other, one


def cut(chance, data):
    end = chance.randrange(len(data))
    del data[end - end % chance.choice([1, SECTOR, 4096]):]


def files_in(folder):
    return [entry.path for entry in os.scandir(folder) if entry.is_file() and entry.stat().st_size > 0]


def copy(source, target):
    shutil.rmtree(target, ignore_errors=True)
    shutil.copytree(source, target, ignore=shutil.ignore_patterns("cache"))


def prepare(city):
    """Folders with the state at rest, and as a killed widget process leaves it."""
    city.run("favorite", "add", *(f"city:{line}" for line in LINES))
    state, rest, killed = (city.folder + name for name in ("/state", "/rest", "/killed"))
    copy(state, rest)
    widget = city.widget()
    widget.appear()
    widget.call("performUpdate", "viewWillDisappear", "viewDidDisappear")
    widget.process.kill()
    widget.process.wait()
    copy(state, killed)
    if not any(path.endswith("-wal") for path in files_in(killed)):
        sys.exit("the killed process left no log")
    return rest, killed


def rot(city, chance, source):
    """What was done to which file."""
    state = city.folder + "/state"
    copy(source, state)
    paths = sorted(files_in(state))
    path = chance.choices(paths, [os.path.getsize(path) for path in paths])[0]
    with open(path, "rb") as file:
        data = bytearray(file.read())
    how = chance.choice([flip, flip, zero, scribble, swap, cut])
    how(chance, data)
    with open(path, "wb") as file:
        file.write(data)
    return f"{how.__name__} {os.path.basename(path)}"


def look(city):
    """Whether it was said that favorites are missing; those that were shown."""
    status, output, _ = city.run("favorite", "list")
    if status not in (0, 1):
        sys.exit(f"favorite list ended with {status}: {output}")
    # Names in messages do not begin a line.
    shown = [line.split()[0][5:] for line in output.splitlines() if line.startswith("city:")]
    if status == 0 and shown != LINES:
        sys.exit(f"of {LINES} only {shown} without a word: {output}")
    if status == 1 and not output.strip():
        sys.exit("an error without a word")
    return status == 1, shown


def repair(city, shown):
    """Puts the favorites that are missing back, as its message says, where the database was set aside."""
    missing = [line for line in LINES if line not in shown]
    for arguments in ([["add", *(f"city:{line}" for line in missing)]] if missing else
                      [["remove", f"city:{LINES[0]}"], ["add", f"city:{LINES[0]}"]]):
        status, output, _ = city.run("favorite", *arguments)
        if status != 0:
            sys.exit(f"favorite {' '.join(arguments)}: {output}")
    if sorted(city.favorites()) != LINES:
        sys.exit("the favorites were not repaired")


def main():
    arguments = sys.argv[1:]
    times = int(arguments[1]) if len(arguments) > 1 else 1000
    seed = int(arguments[2]) if len(arguments) > 2 else random.randrange(1 << 32)
    print(f"seed {seed}", flush=True)
    chance, city, found = random.Random(seed), City(arguments[0]), collections.Counter()
    states = prepare(city)
    for _ in range(times):
        what = rot(city, chance, chance.choice(states))
        said, _ = look(city)
        still_said, shown = look(city)  # of what the first look has left
        if said and any("broken" in name for name in os.listdir(city.folder + "/state")):
            repair(city, shown)
            found["said to be damaged, and repaired"] += 1
        elif said:
            found["refused"] += 1
            print(f"refused after {what}: {city.run('favorite', 'list')[1].strip()}", flush=True)
        else:
            found["all there"] += 1
    print(f"{times} times rotten: " + ", ".join(f"{count} {name}" for name, count in sorted(found.items())))


main()
