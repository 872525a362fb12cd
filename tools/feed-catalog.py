#!/usr/bin/env python3
"""Makes the catalog of feeds that the program ships (resources/feeds/catalog.json.bz2).

    tools/feed-catalog.py FOLDER [-o FILE]

FOLDER holds alert-feeds.jsonl, from the catalog of the Mobility Database, and alert-feeds-atlas.jsonl, from the
Transitland Atlas: one alerts feed a line, with the static feeds that it goes with. A FILE in
~/.local/share/nimbo-transit/feed-catalog.json.bz2 takes the place of the one that is shipped.
"""
import argparse
import bz2
import collections
import json
import pathlib
import re

HERE = pathlib.Path(__file__).resolve().parent
SOURCES = {"alert-feeds.jsonl": "Mobility Database (CC0 1.0)", "alert-feeds-atlas.jsonl": "Transitland Atlas (CC BY 4.0)"}
MOST_AGENCIES, KEPT_AGENCIES = 4, 3
# What is in feeds of one agency that their catalogs name alike, as their static parts say.
KINDS = {"2338": "Tram", "2599": "Tram, Bus, Mobilis", "f-ztp~krakow~bus~rt": "Bus", "1848": "Bus", "1851": "Rail"}


def places():
    lines = (HERE / "feed-places.txt").read_text().splitlines()
    return [line.split("|") for line in lines if line and not line.startswith("#")]


def place_of(feed, table):
    for part, *place in table:
        if part in feed["id"]:
            return place
    return None


def short(provider):
    agencies = provider.split(", ")
    return provider if len(agencies) <= MOST_AGENCIES else ", ".join([*agencies[:KEPT_AGENCIES], "…"])


def part_of(part, provider=None):
    made = {"url": part["url"]}
    if "mirror" in part:
        made["mirror"] = part["mirror"]
    if provider and part.get("provider", provider) != provider:
        made["name"] = short(part["provider"])
    if key := part.get("key"):
        made["key"] = {"in": key["in"], "name": key["name"], "page": key.get("page", "")}
        # An empty parameter waits for the key, which is put at the end.
        made["url"] = re.sub(r"(?<=[?&])%s=(&|$)" % re.escape(key["name"]), "", part["url"]).rstrip("?&")
    return made


def feed_of(feed, table):
    made = {"id": feed["id"], "provider": short(feed["provider"])}
    if feed.get("name", feed["provider"]) != feed["provider"]:
        made["name"] = short(feed["name"])
    found = [feed.get("country"), feed.get("subdivision"), feed.get("municipality")]
    for field, text in zip(("country", "subdivision", "municipality"), found if found[0] else place_of(feed, table) or []):
        if text:
            made[field] = text
    return {**made, "alerts": part_of(feed["alerts"]),
            "static": [part_of(part, feed["provider"]) for part in feed["static"]]}


def looks(feed):
    """What a list shows of it."""
    title = feed["provider"] + (f" ({feed['name']})" if "name" in feed else "")
    return (title, *(feed.get(field, "").casefold() for field in ("country", "subdivision", "municipality")))


def tell_apart(feeds):
    """Adds what feeds that look alike differ in: what is in them, else the first such part of their addresses."""
    alike = collections.defaultdict(list)
    for feed in feeds:
        alike[looks(feed)].append(feed)
    for group in alike.values():
        # The scheme comes last.
        parts = {feed["id"]: re.split(r"[/?]+", re.sub(r"^(\w+)://(.*)", r"\2/\1", feed["alerts"]["url"])) for feed in group}
        shared = set.intersection(*map(set, parts.values()))
        for feed in group:
            own = KINDS.get(feed["id"]) or next((part for part in parts[feed["id"]] if part not in shared), "")
            feed["provider"] += f" – {own}" if own else ""
    assert len(set(map(looks, feeds))) == len(feeds), "feeds that look alike"


def main():
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("folder", type=pathlib.Path)
    parser.add_argument("-o", "--output", type=pathlib.Path, default=HERE.parent / "resources/feeds/catalog.json.bz2")
    arguments = parser.parse_args()
    table = places()
    feeds = [feed_of(json.loads(line), table) for name in SOURCES
             for line in (arguments.folder / name).read_text().splitlines()]
    tell_apart(feeds)
    feeds.sort(key=lambda feed: (feed.get("country", "~"), feed.get("subdivision", ""), feed["provider"], feed["id"]))
    document = {"version": 1, "sources": list(SOURCES.values()), "feeds": feeds}
    packed = bz2.compress(json.dumps(document, ensure_ascii=False, separators=(",", ":")).encode())
    arguments.output.parent.mkdir(parents=True, exist_ok=True)
    arguments.output.write_bytes(packed)
    nowhere = [feed["id"] for feed in feeds if "country" not in feed]
    print(f"{arguments.output}: {len(feeds)} feeds, {len(packed)} bytes; without a place: {', '.join(nowhere) or 'none'}")


if __name__ == "__main__":
    main()
