#!/usr/bin/env python3
"""Times four requests against the provider installed in a running CIM server,
as a client waits for them (not part of make test).

  scripts/server-timings.py --url http://127.0.0.1:5988 [--repeat 3]

The requests go out as plain CIM-XML over HTTP and their answers are read
whole but not parsed, so the time is the server's and the provider's, not a
client library's:
  GetInstance of the last Vexlan_FCHBA_FCPort (in EnumerateInstanceNames order)
  EnumerateInstances of Vexlan_Adapter_PhysicalPort
  AssociatorNames of the first FC port
  Associators of the computer system
Each request runs once to warm up, then --repeat times; the median is printed
with the single times. --mem-repeat N then runs each request N more times, for
watching the provider process's memory from outside (docs/performance.md).
"""
import argparse
import http.client
import re
import statistics
import sys
import time
import urllib.parse

NAMESPACE = "root/vexlan_cmpi"


def body(method, params):
    ns = "".join('<NAMESPACE NAME="%s"/>' % p for p in NAMESPACE.split("/"))
    return ('<?xml version="1.0" encoding="utf-8" ?><CIM CIMVERSION="2.0" DTDVERSION="2.0">'
            '<MESSAGE ID="1001" PROTOCOLVERSION="1.0"><SIMPLEREQ><IMETHODCALL NAME="%s">'
            '<LOCALNAMESPACEPATH>%s</LOCALNAMESPACEPATH>%s</IMETHODCALL></SIMPLEREQ></MESSAGE></CIM>'
            % (method, ns, params)).encode()


def call(url, method, params):
    """One request; its time from sending to the last byte of the answer."""
    conn = http.client.HTTPConnection(url.hostname, url.port or 5988, timeout=600)
    data = body(method, params)
    start = time.perf_counter()
    conn.request("POST", "/cimom", data, {"Content-Type": 'application/xml; charset="utf-8"',
                                          "CIMOperation": "MethodCall", "CIMMethod": method,
                                          "CIMObject": NAMESPACE.replace("/", "%2F")})
    answer = conn.getresponse().read()
    took = time.perf_counter() - start
    conn.close()
    error = re.search(rb"<ERROR[^>]*>", answer)
    if error:
        sys.exit("%s: %s" % (method, error.group(0).decode(errors="replace")))
    return took, answer


def class_param(name):
    return '<IPARAMVALUE NAME="ClassName"><CLASSNAME NAME="%s"/></IPARAMVALUE>' % name


def path_param(param, path):
    return '<IPARAMVALUE NAME="%s">%s</IPARAMVALUE>' % (param, path)


def instance_names(url, cls):
    _, answer = call(url, "EnumerateInstanceNames", class_param(cls))
    return re.findall(r"<INSTANCENAME.*?</INSTANCENAME>", answer.decode(), re.S)


# What one result of each request looks like in its answer.
RESULT = {"GetInstance": rb"<INSTANCE ", "EnumerateInstances": rb"<VALUE.NAMEDINSTANCE>",
          "AssociatorNames": rb"<OBJECTPATH>", "Associators": rb"<VALUE.OBJECTWITHPATH>"}


def main():
    ap = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    ap.add_argument("--url", default="http://127.0.0.1:5988")
    ap.add_argument("--repeat", type=int, default=3)
    ap.add_argument("--mem-repeat", type=int, default=0)
    a = ap.parse_args()
    url = urllib.parse.urlparse(a.url)
    start = time.perf_counter()
    ports = instance_names(url, "Vexlan_FCHBA_FCPort")
    systems = instance_names(url, "Vexlan_Adapter_ComputerSystem")
    if not ports or not systems:
        sys.exit("no FC port or no computer system in %s" % NAMESPACE)
    print("EnumerateInstanceNames of the FC ports (%d), the first of the provider's life builds its lists: %.3f s"
          % (len(ports), time.perf_counter() - start))
    requests = [
        ("GetInstance of the last FCPort", "GetInstance", path_param("InstanceName", ports[-1])),
        ("EnumerateInstances PhysicalPort", "EnumerateInstances", class_param("Vexlan_Adapter_PhysicalPort")),
        ("AssociatorNames of one FC port", "AssociatorNames", path_param("ObjectName", ports[0])),
        ("Associators of the computer system", "Associators", path_param("ObjectName", systems[0])),
    ]
    for label, method, params in requests:
        _, answer = call(url, method, params)
        results = len(re.findall(RESULT[method], answer))
        times = [call(url, method, params)[0] for _ in range(a.repeat)]
        if times:
            print("%-36s %6d results  median %.3f s  (%s)" % (label, results, statistics.median(times),
                                                               " ".join("%.3f" % t for t in times)))
    for label, method, params in requests:
        for _ in range(a.mem_repeat):
            call(url, method, params)
        if a.mem_repeat:
            print("%d more of: %s" % (a.mem_repeat, label))


if __name__ == "__main__":
    main()
