#!/usr/bin/env python3
"""scripts/cimxml_listener.py answers an ExportIndication as a CIM server
expects and prints the indication with its properties in order, an embedded
instance as an instance of its own."""

import http.client
import json
import subprocess
import sys

REQUEST = """<?xml version="1.0" encoding="utf-8" ?>
<CIM CIMVERSION="2.0" DTDVERSION="2.0"><MESSAGE ID="1007" PROTOCOLVERSION="1.0"><SIMPLEEXPREQ>
<EXPMETHODCALL NAME="ExportIndication"><EXPPARAMVALUE NAME="NewIndication">
<INSTANCE CLASSNAME="VexlanCNA_AlertIndication_AdapterStatusChange">
<PROPERTY NAME="IndicationIdentifier" TYPE="string"><VALUE>1</VALUE></PROPERTY>
<PROPERTY.ARRAY NAME="CorrelatedIndications" TYPE="string"><VALUE.ARRAY><VALUE></VALUE></VALUE.ARRAY></PROPERTY.ARRAY>
<PROPERTY NAME="Message" TYPE="string"><VALUE>FC Port 3100027E5A160042 in HBA VXF0000042 status changed to Error</VALUE></PROPERTY>
<PROPERTY NAME="PerceivedSeverity" TYPE="uint16"><VALUE>6</VALUE></PROPERTY>
<PROPERTY NAME="OtherSeverity" TYPE="string"></PROPERTY>
<PROPERTY NAME="SourceInstance" TYPE="string" EmbeddedObject="instance"><VALUE>&lt;INSTANCE CLASSNAME="Vexlan_Adapter_ConcreteJob"&gt;
&lt;PROPERTY NAME="Owner" TYPE="string"&gt;&lt;/PROPERTY&gt;
&lt;PROPERTY NAME="JobState" TYPE="uint16"&gt;&lt;VALUE&gt;7&lt;/VALUE&gt;&lt;/PROPERTY&gt;
&lt;/INSTANCE&gt;</VALUE></PROPERTY>
</INSTANCE></EXPPARAMVALUE></EXPMETHODCALL></SIMPLEEXPREQ></MESSAGE></CIM>
"""


def main(listener):
    proc = subprocess.Popen([sys.executable, listener, "--port", "0", "--count", "1", "--json", "--timeout", "10"],
                            stdout=subprocess.PIPE, stderr=subprocess.PIPE, text=True)
    try:
        first = proc.stderr.readline()
        port = int(first.rsplit(":", 1)[1].strip("/\n"))
        conn = http.client.HTTPConnection("127.0.0.1", port, timeout=10)
        conn.request("POST", "/", REQUEST.encode("utf-8"),
                     {"Content-Type": 'application/xml; charset="utf-8"', "CIMExport": "MethodRequest",
                      "CIMExportMethod": "ExportIndication"})
        reply = conn.getresponse()
        body = reply.read().decode("utf-8")
        assert reply.status == 200, reply.status
        assert reply.getheader("CIMExport") == "MethodResponse", reply.getheaders()
        assert 'MESSAGE ID="1007"' in body and "EXPMETHODRESPONSE" in body, body
        out, _ = proc.communicate(timeout=10)
        assert proc.returncode == 0, proc.returncode
        doc = json.loads(out.strip().splitlines()[-1])
        assert doc["className"] == "VexlanCNA_AlertIndication_AdapterStatusChange", doc
        assert list(doc["properties"]) == ["IndicationIdentifier", "CorrelatedIndications", "Message",
                                           "PerceivedSeverity", "OtherSeverity", "SourceInstance"], doc
        assert doc["properties"]["CorrelatedIndications"] == [""], doc
        assert doc["properties"]["PerceivedSeverity"] == "6" and doc["types"]["PerceivedSeverity"] == "uint16", doc
        assert doc["properties"]["OtherSeverity"] is None, doc
        assert doc["properties"]["SourceInstance"] == {"className": "Vexlan_Adapter_ConcreteJob",
                                                       "properties": {"JobState": "7"},
                                                       "types": {"JobState": "uint16"}}, doc
    finally:
        if proc.poll() is None:
            proc.kill()
    print("listener answered and printed the indication")
    return 0


if __name__ == "__main__":
    sys.exit(main(sys.argv[1]))
