#!/usr/bin/env python3
"""A CIM-XML indication listener: the destination of a CIM_ListenerDestinationCIMXML.

It answers the CIM server's ExportIndication requests (HTTP POST, CIM-XML) and
prints every indication received: its class and its properties in the order
the server sent them, or one JSON document per line with --json. An embedded
instance (a property marked EmbeddedObject, such as the SourceInstance of a
CIM_InstModification) is shown as an instance of its own with the properties
that have a value.

    scripts/cimxml_listener.py --port 5990                # until Ctrl-C
    scripts/cimxml_listener.py --port 5990 --count 2 --timeout 300 --json

Python 3 standard library only. It listens on 127.0.0.1 unless --host says
otherwise, and exits 0 after --count indications, 1 when --timeout passes
first.
"""

import argparse
import http.server
import json
import sys
import threading
import xml.etree.ElementTree as ET

RESPONSE = (
    '<?xml version="1.0" encoding="utf-8"?>\n'
    '<CIM CIMVERSION="2.0" DTDVERSION="2.0"><MESSAGE ID="{id}" PROTOCOLVERSION="1.0">'
    '<SIMPLEEXPRSP><EXPMETHODRESPONSE NAME="ExportIndication"><IRETURNVALUE/>'
    "</EXPMETHODRESPONSE></SIMPLEEXPRSP></MESSAGE></CIM>\n"
)


def property_value(prop):
    """The value of a PROPERTY or PROPERTY.ARRAY element: text, list or None."""
    if prop.tag == "PROPERTY.ARRAY":
        array = prop.find("VALUE.ARRAY")
        if array is None:
            return None
        return [v.text or "" for v in array.findall("VALUE")]
    value = prop.find("VALUE")
    return None if value is None else (value.text or "")


def embedded_instance(prop, value):
    """(class name, [(name, type, value), ...]) of an embedded instance, else None."""
    marked = prop.get("EmbeddedObject") or prop.get("EMBEDDEDOBJECT")
    if not marked or not isinstance(value, str) or "<INSTANCE" not in value:
        return None
    try:
        inst = ET.fromstring(value.strip())
    except ET.ParseError:
        return None
    if inst.tag != "INSTANCE":
        return None
    return inst.get("CLASSNAME"), properties_of(inst, with_nulls=False)


def properties_of(inst, with_nulls=True):
    """[(name, type, value), ...] of an INSTANCE element; an embedded instance as a pair."""
    out = []
    for p in inst:
        if p.tag not in ("PROPERTY", "PROPERTY.ARRAY"):
            continue
        value = property_value(p)
        value = embedded_instance(p, value) or value
        if value is not None or with_nulls:
            out.append((p.get("NAME"), p.get("TYPE", ""), value))
    return out


def indications_of(body):
    """(message id, [(class name, [(name, type, value), ...]), ...]) of a request."""
    root = ET.fromstring(body)
    message = root.find("MESSAGE")
    message_id = message.get("ID", "") if message is not None else ""
    found = []
    for call in root.iter("EXPMETHODCALL"):
        if call.get("NAME") != "ExportIndication":
            continue
        for param in call.findall("EXPPARAMVALUE"):
            for inst in param.findall("INSTANCE"):
                found.append((inst.get("CLASSNAME"), properties_of(inst)))
    return message_id, found


def format_text(class_name, props, indent=""):
    lines = ["instance of %s {" % class_name]
    for name, _type, value in props:
        if value is None:
            shown = "NULL"
        elif isinstance(value, tuple):
            shown = format_text(value[0], value[1], indent + "    ")
        elif isinstance(value, list):
            shown = "{" + ", ".join(json.dumps(v) for v in value) + "}"
        else:
            shown = json.dumps(value)
        lines.append("%s    %s = %s;" % (indent, name, shown))
    lines.append(indent + "}" if indent else "};")
    return "\n".join(lines)


def as_json(props):
    """{"properties": ..., "types": ...} with embedded instances as such documents."""
    def value(v):
        if isinstance(v, tuple):
            return dict({"className": v[0]}, **as_json(v[1]))
        return v
    return {"properties": {n: value(v) for n, _t, v in props}, "types": {n: t for n, t, _v in props}}


class Listener(http.server.BaseHTTPRequestHandler):
    server_version = "cimxml_listener/1"

    def do_POST(self):
        length = int(self.headers.get("Content-Length", "0"))
        body = self.rfile.read(length)
        try:
            message_id, found = indications_of(body)
        except ET.ParseError as err:
            self.send_error(400, "not CIM-XML: %s" % err)
            return
        reply = RESPONSE.format(id=message_id).encode("utf-8")
        self.send_response(200)
        self.send_header("Content-Type", 'application/xml; charset="utf-8"')
        self.send_header("CIMExport", "MethodResponse")
        self.send_header("Content-Length", str(len(reply)))
        self.end_headers()
        self.wfile.write(reply)
        for class_name, props in found:
            self.server.report(class_name, props)

    def log_message(self, fmt, *args):
        if self.server.verbose:
            sys.stderr.write("cimxml_listener: " + (fmt % args) + "\n")


class ListenerServer(http.server.ThreadingHTTPServer):
    def __init__(self, address, as_json, count, verbose):
        super().__init__(address, Listener)
        self.as_json = as_json
        self.count = count
        self.verbose = verbose
        self.received = 0
        self.lock = threading.Lock()
        self.enough = threading.Event()

    def report(self, class_name, props):
        with self.lock:
            if self.as_json:
                doc = dict({"className": class_name}, **as_json(props))
                print(json.dumps(doc), flush=True)
            else:
                print("// indication\n" + format_text(class_name, props) + "\n", flush=True)
            self.received += 1
            if self.count and self.received >= self.count:
                self.enough.set()


def main():
    parser = argparse.ArgumentParser(description=__doc__.split("\n")[0])
    parser.add_argument("--host", default="127.0.0.1")
    parser.add_argument("--port", type=int, default=5990, help="0 picks a free port (printed first)")
    parser.add_argument("--json", action="store_true", help="one JSON document per indication")
    parser.add_argument("--count", type=int, default=0, help="exit after this many indications")
    parser.add_argument("--timeout", type=float, default=0, help="give up after this many seconds")
    parser.add_argument("-v", "--verbose", action="store_true", help="log each request on standard error")
    args = parser.parse_args()

    server = ListenerServer((args.host, args.port), args.json, args.count, args.verbose)
    print("listening on http://%s:%d/" % server.server_address[:2], file=sys.stderr, flush=True)
    thread = threading.Thread(target=server.serve_forever, daemon=True)
    thread.start()
    try:
        done = server.enough.wait(args.timeout if args.timeout > 0 else None)
    except KeyboardInterrupt:
        done = True
    server.shutdown()
    server.server_close()
    return 0 if done else 1


if __name__ == "__main__":
    sys.exit(main())
