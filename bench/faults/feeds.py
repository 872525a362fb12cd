#!/usr/bin/env python3
"""Feeds that no publisher should make, each shown once by nimbo-transit: how long it takes, how much memory at most, and
what the rider sees. None may be shown as good service.

Usage: feeds.py BUILD_FOLDER [NAME...]     all feeds, or those whose name contains one of the given texts
"""
import json, os, signal, socket, sys, tempfile, threading, time, zipfile, zlib
from itertools import chain

from city import AGENCY, LINES, ROUTES, WHOLE_AGENCY, City, entity, field, header, period, text, titled

MIB = 1 << 20
now = int(time.time())
IN_FORCE = period(now - 3600, now + 3600)


def filled(make, size=60 * MIB):
    """header and make(0), make(1)... up to about `size` bytes"""
    parts, total, n = [header()], 0, 0
    while total < size:
        parts.append(make(n))
        total += len(parts[-1])
        n += 1
    return b"".join(parts)


def periods(count, first, step):
    return b"".join(period(first + n * step, first + n * step + 1) for n in range(count))


def alert_feeds():
    yield "millions of entities", lambda: filled(lambda n: entity(str(n), b""))
    yield "100,000 alerts", lambda: header() + b"".join(
        entity(str(n), titled(f"Title {n}") + IN_FORCE + periods(40, now + 9000, 60)) for n in range(100000))
    yield "100,000 alerts of one identifier", lambda: header() + b"".join(
        entity("a", WHOLE_AGENCY + text(10, (f"Title {n}", f"l{n}"))) for n in range(100000))
    yield "an identifier's millions of translations", lambda: header() + b"".join(
        entity("a", WHOLE_AGENCY + text(10, *((f"{n}", f"{half}{n}") for n in range(1000000)))) for half in "xy")
    yield "millions of selectors", lambda: header() + entity(
        "a", WHOLE_AGENCY * 10000000 + text(10, ("Title", "")))
    yield "millions of selectors by trip", lambda: header() + entity(
        "a", titled("T") + b"".join(field(5, field(4, field(1, f"t{n}"))) for n in range(4000000)))
    yield "millions of periods to come", lambda: header() + entity("a", titled("T") + IN_FORCE + periods(3000000, now + 9000, 2))
    yield "millions of periods past", lambda: header() + entity("a", titled("T") + IN_FORCE + periods(3000000, now - 7000000, 2))
    yield "a text of 60 MiB", lambda: header() + entity("a", titled("x" * 60 * MIB))
    for mark in "<", "&", "<a", "&#", "\u200f", "\n", "</", "<!--":
        yield f"texts of {json.dumps(mark)}", lambda mark=mark: filled(
            lambda n: entity(str(n), titled(f"{n}" + mark * (60000 // len(mark.encode())))))
    r0 = field(5, field(2, "r0"))
    by_trip = text(10, ("T", "")) + field(5, field(4, field(1, "trip")))
    yield "an alert by trip alone, without trips", lambda: header() + entity("a", by_trip)
    yield "an alert that breaks off in a selector", lambda: header() + entity("a", text(10, ("T", "")) + b"\x2a\x7f\x12\x02r0")
    yield "an alert that breaks off behind its line", lambda: header() + entity("a", r0 + b"\x52\x7f")
    yield "an entity that breaks off", lambda: header() + field(2, b"\x0a\x7fa")
    yield "positions of vehicles", lambda: header() + field(2, field(1, "v") + field(4, b""))
    yield "times of trips", lambda: header() + field(2, field(1, "u") + field(3, b""))
    yield "alerts of another city", lambda: header() + entity(
        "a", text(10, ("T", "")) + b"".join(field(5, field(2, f"x{n}")) for n in range(3)))
    yield "a proxy's \\r\\n404", lambda: b"\r\n404"
    yield "header without a version", lambda: field(1, field(3, now))
    yield "timestamp of another type", lambda: field(1, field(1, "2.0") + b"\x19" + bytes(8))
    yield "header that goes 100 days back", lambda: header(now - 8640000) + entity("a", titled("T"))


# What a server sends: pieces of an answer, each given to `send`.
def plain(body, head="200 OK"):
    def serve(send):
        send(f"HTTP/1.1 {head}\r\nContent-Length: {len(body)}\r\nConnection: close\r\n\r\n".encode() + body)
    return serve


def endless(first, piece, pause=0):
    def serve(send):
        send(first)
        while True:
            send(piece)
            time.sleep(pause)
    return serve


def gzip_bomb(unpacked):
    packer = zlib.compressobj(9, zlib.DEFLATED, 31)
    zeros = bytes(16 * MIB)
    body = b"".join(packer.compress(zeros) for _ in range(unpacked // len(zeros))) + packer.flush()
    return plain(body, "200 OK\r\nContent-Encoding: gzip")


def transports(good):
    ok = b"HTTP/1.1 200 OK\r\n"
    yield "silence", lambda: endless(b"", b"", 1)
    yield "slow drip", lambda: endless(ok + b"\r\n", b"\n", 1)
    yield "slow drip of headers", lambda: endless(ok, b"X: y\r\n", 1)
    yield "never-ending body", lambda: endless(ok + b"\r\n", bytes(65536))
    yield "never-ending headers", lambda: endless(ok, b"X: " + b"y" * 60000 + b"\r\n")
    yield "never-ending header", lambda: endless(ok + b"X: ", b"y" * 65536)
    yield "never-ending interim answers", lambda: endless(b"", b"HTTP/1.1 100 Continue\r\n\r\n" * 1000)
    yield "gzip bomb of 10 GiB", lambda: gzip_bomb(10240 * MIB)
    packed = zlib.compress(header(), 9, 31)
    for name, body in ("without its trailer", packed[:-8]), ("with another sum", packed[:-8] + bytes(8)):
        yield "gzip " + name, lambda body=body: plain(body, "200 OK\r\nContent-Encoding: gzip")
    yield "cut off", lambda: lambda send: send(ok + b"Content-Length: 999999\r\n\r\n" + good)
    yield "length too short", lambda: lambda send: send(ok + b"Content-Length: %d\r\n\r\n" % (len(good) - 3) + good)
    yield "redirect loop", lambda: plain(b"", "302 Found\r\nLocation: /bad")
    yield "redirect to a file", lambda: plain(b"", "302 Found\r\nLocation: file:///etc/passwd")


def zip_of(entries):
    def write(path):
        with zipfile.ZipFile(path, "w", zipfile.ZIP_DEFLATED) as archive:
            for name, pieces in entries:
                with archive.open(name, "w", force_zip64=True) as file:
                    for piece in [pieces] if isinstance(pieces, (str, bytes)) else pieces:
                        file.write(piece.encode() if isinstance(piece, str) else piece)
    return write


def static_feeds():
    gib = lambda piece: (piece for _ in range(1024 * MIB // len(piece)))
    top = [("agency.txt", AGENCY)]
    yield "zip entry of 1 GiB of zeros", zip_of(top + [("routes.txt", gib(bytes(MIB)))])
    yield "zip entry of 1 GiB of rows", zip_of(top + [("routes.txt", [ROUTES]), ("trips.txt", gib(
        "trip_id,route_id\n" + "t,r1\n" * 200000))])
    yield "routes.txt of 60 MiB", zip_of(top + [("routes.txt", chain(
        [ROUTES], (f"{n:x},A,,3\n" for n in range(4500000))))])
    yield "agency.txt of 60 MiB", zip_of([("agency.txt", chain([AGENCY], (f"{n:x},{n:x}\n" for n in range(4000000)))),
                                          ("routes.txt", ROUTES)])
    yield "trips.txt of 500 MiB", zip_of(top + [("routes.txt", ROUTES), ("trips.txt", (
        "trip_id,route_id\n" if n < 0 else "".join(f"t{n}_{k},r1\n" for k in range(100000)) for n in range(-1, 400)))])
    yield "CSV with a field of 100 MiB", zip_of(top + [("routes.txt", chain(
        [ROUTES, '"'], ("x" * MIB for _ in range(100)), ['"\n']))])
    yield "zip paths that climb", zip_of(top + [("../routes.txt", ROUTES), ("/etc/routes.txt", ROUTES)])
    yield "zip of 300,000 entries", zip_of(top + [(f"{n}/x", "") for n in range(300000)])


class Server:
    """A process that answers each path by what its function made. Apart from this one: a program that is started counts
    the memory of who starts it as its own."""

    def __init__(self, make):
        reading, writing = os.pipe()
        self.pid = os.fork()
        if self.pid == 0:
            try:
                self.answers = {path: made() for path, made in make.items()}
                listening = socket.create_server(("127.0.0.1", 0))
                os.write(writing, str(listening.getsockname()[1]).encode())
                while True:
                    threading.Thread(target=self.serve, args=(listening.accept()[0],), daemon=True).start()
            finally:
                os._exit(1)
        os.close(writing)
        self.address = f"http://127.0.0.1:{os.read(reading, 16).decode()}"
        os.close(reading)

    def serve(self, connection):
        try:
            request = b""
            while b"\r\n\r\n" not in request:
                request += connection.recv(65536)
            self.answers[request.split()[1].decode()](connection.sendall)
            connection.shutdown(socket.SHUT_WR)
            while connection.recv(65536):
                pass
        except OSError:
            pass
        connection.close()

    def close(self):
        os.kill(self.pid, signal.SIGKILL)
        os.waitpid(self.pid, 0)


def main():
    build, wanted = sys.argv[1], sys.argv[2:]
    good = header() + entity("a", titled("Works"))
    bad = 0
    print(f"| {'fault':42} | {'s':>5} | {'MiB':>5} | what the rider sees |\n|---|---:|---:|---|", flush=True)

    def show(name, make):
        nonlocal bad
        if wanted and not any(w in name for w in wanted):
            return
        is_static = name.startswith("static feed: ")
        server = Server({"/good": lambda: plain(good), "/bad": make})
        city = City(build, alerts=server.address + ("/good" if is_static else "/bad"))
        city.run("favorite", "add", *(f"city:{line}" for line in LINES))
        if is_static:
            with open(city.folder + "/config/feeds.json") as file:
                settings = file.read().replace(city.folder + "/feed", server.address + "/bad")
            with open(city.folder + "/config/feeds.json", "w") as file:
                file.write(settings)
        begin = time.monotonic()
        status, output, mib = city.run("status")
        seconds = time.monotonic() - begin
        server.close()
        title, _, reason = output.partition("nimbo-transit: ")
        title = title.split("  ")[0].splitlines()[0].strip() if title.strip() else ""
        reason = reason.strip().replace(server.address, "").split(". ")[0]
        bad += status not in (0, 1) or "Good Service" in output
        print(f"| {name:42} | {seconds:5.1f} | {mib:5} | {title[:40]}{': ' + reason if reason else ''} |", flush=True)

    for name, make in alert_feeds():
        show(name, lambda: plain(make()))
    for name, make in transports(good):
        show(name, make)
    for name, write in static_feeds():
        def zipped():
            with tempfile.NamedTemporaryFile() as file:
                write(file.name)
                return plain(file.read())
        show("static feed: " + name, zipped)
    for name, make in transports(good):
        if "drip" in name or "silence" in name or "never" in name:
            show("static feed: " + name, make)
    if bad:
        sys.exit(f"{bad} faults were shown as good service, or ended the program")


main()
