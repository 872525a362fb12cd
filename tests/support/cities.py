"""A city that tests publish: a metro of three lines, and its alerts."""
import os
import pathlib

from city import entity, field, header, text


def publish(folder, alerts, image=None):
    """Writes a city's feed with alerts: a header, of line 1 and with an image where an address is given, or an identifier,
    a header, lines and a severity, of delays."""
    os.makedirs(folder, exist_ok=True)
    tables = {"agency.txt": "agency_id,agency_name,agency_url,agency_timezone\nM,Metro,https://example.org,UTC\n",
              "routes.txt": "route_id,agency_id,route_short_name,route_long_name,route_type,route_color\n"
                            "m1,M,1,Harbour Line,1,005599\nm2,M,2,Castle Line,1,CC0000\nm3,M,3,Ring,1,\n"}
    for name, table in tables.items():
        pathlib.Path(folder, name).write_text(table)
    shown = field(15, field(1, field(1, image) + field(2, "image/png"))) + text(16, ("A map", "")) if image else b""
    feed = header()
    for alert in alerts:
        number, title, lines, *severity = (alert, alert, ["m1"]) if isinstance(alert, str) else alert
        selectors = b"".join(field(5, field(2, line)) for line in lines)
        delays = field(7, 3) + field(14, severity[0]) if severity else b""
        feed += entity(number, selectors + delays + text(10, (title, "")) + shown)
    pathlib.Path(folder, "new").write_bytes(feed)
    os.replace(f"{folder}/new", f"{folder}/alerts.pb")
