#!/usr/bin/env python3
"""Threads that cannot start: a widget process in which only so many of them do, each shown once by nimbo-transit. Every
fetch ends, and what was not read is not shown as good service.

Usage: threads.py BUILD_FOLDER
"""
import json, os, subprocess, sys, time

from city import LINES, City, entity, header, period, titled

# Stands before the C library's own in the widget process, and lets the given number of threads start, besides those of
# GLib: Pango starts one for each font, and a program in which GLib cannot start one is ended by it.
SOURCE = r"""
#define _GNU_SOURCE
#include <dlfcn.h>
#include <errno.h>
#include <pthread.h>
#include <stdlib.h>
#include <string.h>
int pthread_create(pthread_t* thread, const pthread_attr_t* attributes, void* (*run)(void*), void* argument) {
  static int started;
  Dl_info caller;
  int (*real)(pthread_t*, const pthread_attr_t*, void* (*)(void*), void*) = dlsym(RTLD_NEXT, "pthread_create");
  int ours = !dladdr(__builtin_return_address(0), &caller) || !strstr(caller.dli_fname, "libglib");
  if (ours && !strcmp(program_invocation_short_name, "nimbo-transit-widget") &&
      __atomic_add_fetch(&started, 1, __ATOMIC_RELAXED) > atoi(getenv("FAULT_THREADS")))
    return EAGAIN;
  return real(thread, attributes, run, argument);
}
"""
MOST = 4


def main():
    now = int(time.time())
    city = City(sys.argv[1])
    library = city.folder + "/threads.so"
    subprocess.run(["cc", "-shared", "-fPIC", "-o", library, "-x", "c", "-", "-ldl"], input=SOURCE.encode(), check=True)
    # A second feed, which is looked up on a thread of its own.
    with open(city.folder + "/config/feeds.json") as file:
        feeds = json.load(file)["feeds"]
    with open(city.folder + "/config/feeds.json", "w") as file:
        json.dump({"feeds": feeds + [dict(feeds[0], name="town")]}, file)
    city.publish(header() + entity("a", titled("Works") + period(now - 3600, now + 3600)))
    city.run("favorite", "add", *(f"{feed}:{line}" for feed in ("city", "town") for line in LINES[:2]))
    print(f"| {'threads that start':>18} | {'s':>5} | what the rider sees |\n|---:|---:|---|", flush=True)
    bad = 0
    os.environ["LD_PRELOAD"] = library
    for count in range(MOST + 1):
        os.environ["FAULT_THREADS"] = str(count)
        begin = time.monotonic()
        status, output, _ = city.run("status")
        seconds = time.monotonic() - begin
        title, _, reason = output.partition("nimbo-transit: ")
        title = title.split("  ")[0].splitlines()[0].strip() if title.strip() else ""
        reason = reason.strip().split(". ")[0]
        bad += status not in (0, 1) or "Good Service" in output or (status == 0) != any(words in output for words in ("Works", "Advisories")) or seconds > 61
        print(f"| {count:18} | {seconds:5.1f} | {title[:40]}{': ' + reason if reason else ''} |", flush=True)
    if bad:
        sys.exit(f"{bad} fetches did not end, or ended in the wrong words")


main()
