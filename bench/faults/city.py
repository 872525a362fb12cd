"""A small city for the tools beside this file: its feed, folders of its own, and the built programs run on it."""
import json, os, socketserver, subprocess, tempfile, threading, time

LINES = [f"r{n}" for n in range(10)]
AGENCY = "agency_id,agency_name\nA,Metro\n"
ROUTES = "route_id,agency_id,route_short_name,route_type\n" + "".join(f"{r},A,{r},3\n" for r in LINES)


# Just enough of the wire format of GTFS-Realtime (https://gtfs.org/documentation/realtime/proto/).
def varint(n):
    out = bytearray()
    while n > 0x7F:
        out.append(n & 0x7F | 0x80)
        n >>= 7
    out.append(n)
    return bytes(out)


def field(number, value):
    if isinstance(value, int):
        return varint(number << 3) + varint(value)
    value = value.encode() if isinstance(value, str) else value
    return varint(number << 3 | 2) + varint(len(value)) + value


def header(made=None):
    return field(1, field(1, "2.0") + field(3, int(time.time()) if made is None else made))


def entity(name, alert):
    return field(2, field(1, name) + field(5, alert))


def period(start, end):
    return field(1, field(1, start) + field(2, end))


def text(number, *translations):
    return field(number, b"".join(field(1, field(1, t) + (field(2, lang) if lang else b"")) for t, lang in translations))


WHOLE_AGENCY = field(5, field(1, "A"))


def titled(title):
    return WHOLE_AGENCY + text(10, (title, ""))


class City:
    """Its feed is the files of `feed`, or comes from the given addresses."""

    def __init__(self, build, static=None, alerts=None, **settings):
        self.build = os.path.abspath(build)
        self.holder = tempfile.TemporaryDirectory(prefix="nimbo-city-")
        self.folder = self.holder.name
        self.folders = ["--config", self.folder + "/config", "--state", self.folder + "/state"]
        os.mkdir(self.folder + "/feed")
        for name, content in ("agency.txt", AGENCY), ("routes.txt", ROUTES):
            with open(f"{self.folder}/feed/{name}", "w") as file:
                file.write(content)
        self.publish(header())
        os.mkdir(self.folder + "/config")
        feed = {"name": "city", "static": static or self.folder + "/feed",
                "alerts": alerts or self.folder + "/feed/alerts.pb", **settings}
        with open(self.folder + "/config/feeds.json", "w") as file:
            json.dump({"feeds": [feed]}, file)

    def publish(self, alerts):
        """What the alerts file holds from now on, never half of it."""
        new = self.folder + "/feed/new"
        with open(new, "wb") as file:
            file.write(alerts)
        os.replace(new, self.folder + "/feed/alerts.pb")

    def start(self, *arguments):
        """nimbo-transit with these arguments; its output and errors go to `output`."""
        output = tempfile.TemporaryFile()
        process = subprocess.Popen([self.build + "/src/host/nimbo-transit", *self.folders, *arguments],
                                   stdin=subprocess.DEVNULL, stdout=output, stderr=output)
        process.output = output
        return process

    def run(self, *arguments):
        """Its exit status, output, and MiB that it and the widget process had at most."""
        process = self.start(*arguments)
        _, status, usage = os.wait4(process.pid, 0)
        process.returncode = os.waitstatus_to_exitcode(status)
        process.output.seek(0)
        return process.returncode, process.output.read().decode(errors="replace"), usage.ru_maxrss // 1024

    def favorites(self):
        status, output, _ = self.run("favorite", "list")
        if status != 0:
            raise SystemExit("favorite list: " + output)
        return [word[5:] for word in output.split() if word.startswith("city:")]

    def widget(self, *arguments):
        return Widget([self.build + "/src/process/nimbo-transit-widget", *self.folders, *arguments])


class Server:
    """On loopback, answers the body that it serves; "not modified" to who has that, unless it is `forgetful`; with an
    error while it is `broken`."""

    def __init__(self):
        server = self

        class Handler(socketserver.BaseRequestHandler):
            def handle(self):
                request = b""
                while b"\r\n\r\n" not in request:
                    piece = self.request.recv(65536)
                    if not piece:
                        return
                    request += piece
                if server.broken:
                    self.request.sendall(b"HTTP/1.1 503 Oops\r\nConnection: close\r\n\r\n")
                    return
                if not server.forgetful and f"If-None-Match: {server.etag}".encode() in request:
                    self.request.sendall(b"HTTP/1.1 304 Not Modified\r\nConnection: close\r\n\r\n")
                    return
                name = "" if server.forgetful else f"ETag: {server.etag}\r\n"
                self.request.sendall(f"HTTP/1.1 200 OK\r\n{name}Content-Length: {len(server.body)}\r\n"
                                     "Connection: close\r\n\r\n".encode() + server.body)

        class Threaded(socketserver.ThreadingTCPServer):
            daemon_threads = True
            request_queue_size = 64

        self.forgetful = self.broken = False
        self.number = 0
        self.serve(b"")
        self.server = Threaded(("127.0.0.1", 0), Handler)
        self.address = f"http://127.0.0.1:{self.server.server_address[1]}/"
        threading.Thread(target=self.server.serve_forever, daemon=True).start()

    def serve(self, body):
        self.number += 1
        self.body, self.etag = body, f'"{self.number}"'


class Widget:
    """A widget process and its host's end of the two pipes."""

    def __init__(self, command):
        self.process = subprocess.Popen(command, stdin=subprocess.PIPE, stdout=subprocess.PIPE)
        self.count = self.heard = 0

    def written(self):
        """Bytes that it has written into files."""
        with open(f"/proc/{self.process.pid}/io") as file:
            return next(int(line.split()[1]) for line in file if line.startswith("wchar")) - self.heard

    def send(self, *requests):
        lines = []
        for request in requests:
            method, params = request if isinstance(request, tuple) else (request, {})
            self.count += 1
            lines.append(json.dumps({"jsonrpc": "2.0", "id": self.count, "method": method, "params": params}) + "\n")
        self.process.stdin.write("".join(lines).encode())
        self.process.stdin.flush()

    def call(self, *requests):
        """The last request's result."""
        self.send(*requests)
        for line in self.process.stdout:
            self.heard += len(line)
            message = json.loads(line)
            if message.get("id") == self.count and "method" not in message:
                if "error" in message:
                    raise SystemExit(f"{requests[-1]}: {message['error']}")
                return message["result"]
        raise SystemExit(f"the widget process ended before it answered {requests[-1]}")

    def appear(self):
        sizes = {"compact": [359, 110], "expanded": [359, 440]}
        self.call(("initialize", {"locale": "en", "displayModes": sizes}), "loadView", "viewWillAppear", "viewDidAppear")

    def titles(self):
        return [row.get("primaryText") for row in self.call("snapshot")["rows"]]

    def close(self):
        self.process.stdin.close()
        self.process.stdout.read()
        return self.process.wait()
