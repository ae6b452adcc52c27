#!/usr/bin/env python3
"""The provider's benchmark: generates benchmark hosts (adapter descriptions),
runs the driver (vexlan_bench) on each under callgrind, splits the counted
instructions by who spent them, and writes docs/performance.md with a plot.

    run_bench.py --build DIR [--sizes 1,16,256,1024] [--walk-sizes 16,64,256,1024] [--out docs/performance.md]
                 [--no-callgrind] [--check] [--as-before] [--walks-only]

Instruction counts are callgrind's (deterministic); wall times are medians of
native runs and only indicative. --no-callgrind --check runs the whole chain
natively on the given sizes into a temporary directory and fails when a request
fails or a table comes out empty (the test of the benchmark). --as-before also
stores the tables as the "before" section that later runs keep. --walks-only
counts only the fixed cost of a request (GetInstance of the computer system)
and the associations from the system, one FC port and one storage extent, and
prints their table instead of writing the document; the document's table of
those comes from such runs at the --walk-sizes.
"""
import argparse
import copy
import datetime
import json
import os
import platform
import re
import shutil
import subprocess
import sys
import tempfile

ROOT = os.path.dirname(os.path.dirname(os.path.abspath(__file__)))
TEMPLATE = os.path.join(ROOT, "platform", "adapterlib", "data", "zorap_sim_adapters.json")
CLASS_TABLE = os.path.join(ROOT, "mof", "classes.tsv")

PROVIDER_OBJECT = "libVexlan_CNA_Provider.so"
ADAPTER_OBJECT = "libzorap_cna_provider.so"
DRIVER_OBJECT = "vexlan_bench"
# The host's result functions: handing results over.
DELIVERY = re.compile(r"\brs(Data|Instance|Path|Done)\(")
# The host's broker functions (its broker, encapsulated-object factory and
# extended function tables): the calls that are messages in a server whose
# provider runs in an agent process.
BROKER_CALL = re.compile(r"(^|[^A-Za-z0-9_])[bex][A-Z][A-Za-z0-9]*\(")
# The list builds that FCPort and FCPortStatistics requests run first.
REBUILDS = {"Vexlan_FCHBA_FCPort": "buildFCPortList()",
            "Vexlan_FCHBA_FCPortStatistics": "buildFCPortStatisticsList()"}

BEFORE_BEGIN = "<!-- before:begin -->"
BEFORE_END = "<!-- before:end -->"
# Measurements in a real server, written by hand between these marks (what the
# benchmark cannot count: a server's own work, its agent process, its memory);
# every run keeps them.
SERVER_BEGIN = "<!-- server:begin -->"
SERVER_END = "<!-- server:end -->"


# ---------------------------------------------------------------- hosts

def wwn(*octets):
    return ":".join("%02x" % (o & 0xFF) for o in octets)


def lun_id(lun, kind, p, t, a):
    """The LUN's identifier of the template with its last six bytes its own."""
    head = lun["id"].split(":")[:-6]
    return ":".join(head + ["%02x" % x for x in (kind, p, t, a >> 8, a & 0xFF, lun["lun"])])


def adapter_copy(template, serial, uuid):
    """A copy of the template adapter with its own serial number (also in
    the VPD) and VPD UUID, and no instance number of its own."""
    ad = copy.deepcopy(template)
    ad["serialNumber"] = serial
    ad["vpd"]["SN"] = serial
    ad["vpd"]["YU"] = uuid
    ad.pop("instance", None)
    return ad


def fc_adapter(template, a):
    """Adapter `a` of an FC host: the template's first adapter with four
    ports, one FC function each, every name and address its own."""
    hi, lo = a >> 8, a & 0xFF
    ad = adapter_copy(template, "VXB%07d" % a, "3f2a9c1e-7d44-4b0a-9e51-%012x" % a)
    ports = []
    for p in range(4):
        port = copy.deepcopy(template["ports"][p % len(template["ports"])])
        port["portNumber"] = p
        port["transceiver"]["serialNumber"] = "VXS%06d%d" % (a, p)
        for proto in port["protocols"]:
            proto["portIndex"] = p
            proto["nodeWWN"] = wwn(0x30, 0, 2, 0x7E, 0x5B, hi, lo, 0)
            proto["portWWN"] = wwn(0x31, p, 2, 0x7E, 0x5B, hi, lo, 0)
            proto["fcId"] = "0x%06x" % (((p + 1) << 16) | a)
            for t, target in enumerate(proto.get("targets", [])):
                target["portWWN"] = wwn(0x3A, p, t, 0x4E, hi, lo, 0xA0, 1)
                target["nodeWWN"] = wwn(0x3A, p, t, 0x4E, hi, lo, 0xA0, 0)
                target["portId"] = "0x%06x" % (((p + 1) << 16) | (a & 0xFF) << 8 | 0x40 | t)
                for lun in target.get("luns", []):
                    lun["id"] = lun_id(lun, 0xA0, p, t, a)
        ports.append(port)
    ad["ports"] = ports
    return ad


def cna_adapter(template, a):
    """Adapter `a` of a mixed host: the template's CNA, each port with an
    FCoE and a NIC function, every name and address its own."""
    hi, lo = a >> 8, a & 0xFF
    ad = adapter_copy(template, "VXD%07d" % a, "5b7c2e91-0a3d-4f62-8c15-%012x" % a)
    ad["i2cUuid"] = "8d1e5c40-2b6f-4e19-a3c7-%012x" % a
    for p, port in enumerate(ad["ports"]):
        port["transceiver"]["serialNumber"] = "VXT%06d%d" % (a, p)
        for proto in port["protocols"]:
            node = wwn(0x30, 0, 2, 0x7E, 0x5C, hi, lo, 0)
            pwwn = wwn(0x31, p, 2, 0x7E, 0x5C, hi, lo, 0)
            enode = wwn(2, 0x7E, 0x5C, hi, lo, 0x10 + p)
            if proto["type"] == "fcoe":
                proto["nodeWWN"], proto["portWWN"], proto["enodeMac"] = node, pwwn, enode
                proto["fcId"] = "0x%06x" % (((p + 1) << 16) | a)
                for t, target in enumerate(proto.get("targets", [])):
                    target["portWWN"] = wwn(0x3B, p, t, 0x4E, hi, lo, 0xC0, 1)
                    target["nodeWWN"] = wwn(0x3B, p, t, 0x4E, hi, lo, 0xC0, 0)
                    for lun in target.get("luns", []):
                        lun["id"] = lun_id(lun, 0xC0, p, t, a)
            elif proto["type"] == "nic":
                proto["mac"] = wwn(2, 0x7E, 0x5C, hi, lo, p)
                proto["interface"] = "enp%ds0f%d" % (a, p)
                proto["pci"] = "%04x:05:00.%d" % (a, p)
                proto["ipv4"] = "10.%d.%d.%d" % (hi, lo, p + 1)
                proto["ipv6"] = ["fe80::%x:%x/64" % (a, p), "2001:db8:%x::%x/64" % (a, p + 1)]
                for link in proto.get("fcoe", []):
                    link["portWWN"], link["nodeWWN"], link["enodeMac"] = pwwn, node, enode
                    link["fcHostName"] = "host%d" % (10 + 2 * a + p)
    return ad


def describe(kind, adapters):
    with open(TEMPLATE) as f:
        base = json.load(f)
    fc, cna = base["adapters"][0], base["adapters"][1]
    if kind == "fc":
        chosen = [fc_adapter(fc, a) for a in range(adapters)]
    else:
        chosen = [cna_adapter(cna, a) if a % 2 == 0 else fc_adapter(fc, a) for a in range(adapters)]
    return {"flash": base.get("flash", {}), "adapters": chosen}


def instance_classes():
    """Every class that answers instance requests, associations left out,
    in the order of the class table."""
    out = []
    with open(CLASS_TABLE) as f:
        for line in f:
            if line.startswith("#") or not line.strip():
                continue
            cols = line.rstrip("\n").split("\t")
            if len(cols) >= 4 and "instance" in cols[3].split() and "association" not in cols[3].split():
                out.append(cols[0])
    return out


# ---------------------------------------------------------------- runs

def run_driver(build, work, description, callgrind, repeat, walks_only=False, provider=None):
    os.makedirs(work, exist_ok=True)
    desc_path = os.path.join(work, "host.json")
    with open(desc_path, "w") as f:
        json.dump(description, f)
    # No poll round during the run: the interval far beyond its length.
    with open(os.path.join(work, "vexlancna.properties"), "w") as f:
        f.write("LinkStatusPollIntervalSeconds=1000000\n")
    cmd = [os.path.join(build, "bin", "vexlan_bench"),
           "--provider", provider or os.path.join(build, "lib", "libVexlan_CNA_Provider.so.1"),
           "--mof", os.path.join(build, "share", "vexlan-cna", "mof"),
           "--repeat", str(repeat)] + (["--walks-only"] if walks_only else []) + instance_classes()
    if callgrind:
        cmd = ["valgrind", "--tool=callgrind", "--callgrind-out-file=" + os.path.join(work, "cg.out"),
               "--dump-line=no"] + cmd
    env = dict(os.environ, ZORAP_SIM_ADAPTERS=desc_path)
    proc = subprocess.run(cmd, cwd=work, env=env, stdout=subprocess.PIPE, stderr=subprocess.PIPE,
                          universal_newlines=True)
    if proc.returncode != 0 or "adapter description" in proc.stderr:
        sys.stderr.write(proc.stderr)
        raise SystemExit("run_bench: the driver failed (%d)" % proc.returncode)
    with open(os.path.join(work, "driver.out"), "w") as f:
        f.write(proc.stdout)
    rows = [json.loads(line) for line in proc.stdout.splitlines() if line.startswith("{")]
    if callgrind:
        parts = callgrind_parts(work)
        for row in rows:
            if row["label"] in parts:
                row["split"] = parts[row["label"]]
    return rows


def callgrind_parts(work):
    """label -> split of every dump the driver asked for."""
    out = {}
    for name in os.listdir(work):
        if re.fullmatch(r"cg\.out\.\d+", name):
            label, split = parse_callgrind(os.path.join(work, name))
            if label is not None:
                out[label] = split
    return out


def parse_callgrind(path):
    """The split of one callgrind dump: instructions under the provider's own
    functions, and those of its calls into the host (delivery and the rest),
    into the adapter library and into every other object (C and C++
    libraries, counted as the provider's own)."""
    label = None
    names = {"ob": {}, "fn": {}}
    ob = cob = fn = cfn = None
    self_cost = {}        # (ob, fn) -> Ir
    calls = []            # (caller ob, caller fn, callee ob, callee fn, Ir, count)
    pending_call = False
    call_count = 0

    def name_of(kind, text):
        m = re.match(r"\((\d+)\)(?: (.*))?$", text)
        if not m:
            return text
        if m.group(2) is not None:
            names[kind][m.group(1)] = m.group(2)
            return m.group(2)
        return names[kind].get(m.group(1), text)

    with open(path, errors="replace") as f:
        for line in f:
            line = line.rstrip("\n")
            if line.startswith("desc: Trigger: Client Request: "):
                label = line[len("desc: Trigger: Client Request: "):]
            elif line.startswith("ob="):
                ob = name_of("ob", line[3:])
            elif line.startswith("cob="):
                cob = name_of("ob", line[4:])
            elif line.startswith("fn="):
                fn = name_of("fn", line[3:])
                cob = None
            elif line.startswith("cfn="):
                cfn = name_of("fn", line[4:])
            elif line.startswith("calls="):
                pending_call = True
                call_count = int(line[6:].split()[0])
            elif line and (line[0].isdigit() or line[0] in "+-*"):
                parts = line.split()
                cost = int(parts[1]) if len(parts) > 1 else 0
                if pending_call:
                    calls.append((ob, fn, cob if cob is not None else ob, cfn, cost, call_count))
                    pending_call = False
                    cob = None
                else:
                    self_cost[(ob, fn)] = self_cost.get((ob, fn), 0) + cost

    def is_provider(o):
        return o is not None and PROVIDER_OBJECT in o

    split = {"own": 0, "broker": 0, "delivery": 0, "adapter": 0, "rebuild": {}, "broker_calls": 0}
    for (o, f), c in self_cost.items():
        if is_provider(o):
            split["own"] += c
    for o, f, co, cf, c, n in calls:
        if is_provider(o) and co is not None and co.endswith(DRIVER_OBJECT) and cf and BROKER_CALL.search(cf):
            split["broker_calls"] += n
        if f in REBUILDS.values() and is_provider(o):
            split["rebuild"][f] = split["rebuild"].get(f, 0) + c
        if not is_provider(o) or is_provider(co):
            continue
        if co is not None and co.endswith(DRIVER_OBJECT):
            split["delivery" if cf and DELIVERY.search(cf) else "broker"] += c
        elif co is not None and ADAPTER_OBJECT in co:
            split["adapter"] += c
        else:
            split["own"] += c
    for (o, f), c in self_cost.items():
        if f in REBUILDS.values() and is_provider(o):
            split["rebuild"][f] = split["rebuild"].get(f, 0) + c
    return label, split


# ---------------------------------------------------------------- report

def instructions(split):
    return split["own"] + split["broker"] + split["delivery"] + split["adapter"]


def kilo(n):
    return "%.1fk" % (n / 1000.0)


def ratio(a, b):
    return "%.2f" % (a / b) if b else "-"


def by_label(rows):
    return {r["label"]: r for r in rows}


def list_classes(runs):
    """Classes whose instance count grows with the host: the listed ones."""
    sizes = sorted(runs)
    small, large = by_label(runs[sizes[0]]), by_label(runs[sizes[-1]])
    out = []
    for cls in instance_classes():
        a, b = small.get("ei " + cls), large.get("ei " + cls)
        if a and b and b["results"] > 0 and (b["results"] > a["results"] or len(sizes) == 1):
            out.append(cls)
    return out


def split_row(row):
    s, n = row["split"], max(row["results"], 1)
    total = s["own"] + s["broker"] + s["delivery"] + s["adapter"]
    return [kilo(total / n), kilo(s["broker"] / n), kilo(s["delivery"] / n), kilo(s["adapter"] / n),
            kilo(s["own"] / n), ratio(s["own"], s["broker"]), ratio(s["delivery"], s["broker"])]


def table(header, rows):
    out = ["| " + " | ".join(header) + " |", "|" + "---|" * len(header)]
    out += ["| " + " | ".join(str(c) for c in r) + " |" for r in rows]
    return "\n".join(out) + "\n"


SPLIT_HEADER = ["per instance", "broker build", "host delivery", "adapter library", "provider own",
                "own / broker build", "delivery / broker build"]


def per_instance_total(row):
    s = row["split"]
    return (s["own"] + s["broker"] + s["delivery"] + s["adapter"]) / max(row["results"], 1)


def scenario_tables(title, runs, counted, walk_runs=None):
    sizes = sorted(runs)
    big = by_label(runs[sizes[-1]])
    classes = list_classes(runs)
    doc = ["## %s\n" % title]
    if counted:
        doc.append("### EnumerateInstances at %d adapters (instructions)\n" % sizes[-1])
        rows = [["`%s`" % c, big["ei " + c]["results"]] + split_row(big["ei " + c]) for c in classes]
        doc.append(table(["class", "instances"] + SPLIT_HEADER, rows))
        doc.append("\n### EnumerateInstanceNames at %d adapters\n" % sizes[-1])
        rows = [["`%s`" % c, big["ein " + c]["results"]] + split_row(big["ein " + c]) for c in classes]
        doc.append(table(["class", "paths"] + SPLIT_HEADER, rows))
        if len(sizes) > 1:
            doc.append("\n### Growth: instructions per enumerated instance\n")
            rows = []
            for c in classes:
                vals = [per_instance_total(by_label(runs[s])["ei " + c]) for s in sizes]
                ref = [v for s, v in zip(sizes, vals) if s == 16]
                rows.append(["`%s`" % c] + [kilo(v) for v in vals] +
                            [ratio(vals[-1], ref[0]) if ref else "-"])
            doc.append(table(["class"] + ["%d adapters" % s for s in sizes] +
                             ["%d / 16" % sizes[-1]], rows))
        doc.append("\n### GetInstance at %d adapters (instructions per request)\n" % sizes[-1])
        rows = []
        for c in classes:
            f, l = big.get("gi first " + c), big.get("gi last " + c)
            if f and l and "split" in f and "split" in l:
                rows.append(["`%s`" % c, kilo(instructions(f["split"])),
                             kilo(instructions(l["split"]))])
        doc.append(table(["class", "first entry", "last entry"], rows))
        rebuild_rows = []
        for s in sizes:
            lab = by_label(runs[s])
            for c, fn in REBUILDS.items():
                row = lab.get("ei " + c)
                if row and "split" in row and fn in row["split"]["rebuild"]:
                    rebuild_rows.append([s, "`%s`" % c, row["results"],
                                         kilo(row["split"]["rebuild"][fn] / max(row["results"], 1))])
        if rebuild_rows:
            doc.append("\n### Rebuild before each FCPort and FCPortStatistics request (instructions per function)\n")
            doc.append(table(["adapters", "class", "functions", "rebuild per function"], rebuild_rows))
        doc.append("\n### Associations at %d adapters\n" % sizes[-1])
        rows = []
        for end in ("system", "port", "extent"):
            for op in ("ai", "ain", "ri", "rin"):
                r = big.get("%s %s" % (op, end))
                if r and "split" in r:
                    s = r["split"]
                    rows.append([op, end, r["results"], kilo(instructions(s)), kilo(s["own"]), kilo(s["broker"]),
                                 kilo(s["delivery"]), kilo(s["adapter"]), s.get("broker_calls", "-")])
        doc.append(table(["request", "from", "results", "total", "provider own", "broker build",
                          "host delivery", "adapter library", "broker calls"], rows))
        doc.append("\n" + walk_table(walk_runs or runs))
        assoc = big.get("ai system")
        if assoc and "split" in assoc:
            enum_total = 0
            for c in assoc.get("classes", []):
                r = big.get("ei " + c)
                if r and "split" in r:
                    enum_total += instructions(r["split"])
            a_total = instructions(assoc["split"])
            doc.append("\nAssociators of the computer system against EnumerateInstances of the same result "
                       "classes: %s against %s, ratio %s.\n" % (kilo(a_total), kilo(enum_total),
                                                                ratio(a_total, enum_total)))
        doc.append("\n### First build at start (instructions, all lists)\n")
        rows = []
        for s in sizes:
            r = by_label(runs[s]).get("start")
            if r and "split" in r:
                t = instructions(r["split"])
                rows.append([s, kilo(t), kilo(r["split"]["adapter"])])
        doc.append(table(["adapters", "total", "adapter library"], rows))
    return "".join(doc)


WALKS = [("gi first Vexlan_Adapter_ComputerSystem", "GetInstance of the computer system")] + [
    ("%s %s" % (op, end), "%s from %s" % (name, what))
    for end, what in (("port", "one FC port"), ("extent", "one StorageExtent"))
    for op, name in (("ain", "AssociatorNames"), ("rin", "ReferenceNames"))]


def walk_table(runs):
    """The fixed cost of a request and the walks from one element at every
    size: instructions (total and the provider's own), broker calls, and the
    growth of the total from the next smaller size against the growth of the
    host (1.00: as fast as the host)."""
    sizes = sorted(runs)
    rows = []
    for label, name in WALKS:
        before = None
        for s in sizes:
            r = by_label(runs[s]).get(label)
            if r and "split" in r:
                sp = r["split"]
                growth = "-"
                if before is not None and before[1] > 0:
                    growth = "%.2f" % ((instructions(sp) / before[1]) / (s / before[0]))
                rows.append([name, "%d (%d FC functions)" % (s, 4 * s), r["results"], kilo(instructions(sp)),
                             kilo(sp["own"]), kilo(sp["adapter"]), sp.get("broker_calls", "-"), growth])
                before = (s, instructions(sp))
    return ("### Fixed cost of a request and walks from one element (instructions and broker calls per request)\n"
            + table(["request", "adapters", "results", "total", "provider own", "adapter library",
                     "broker calls", "growth / host growth"], rows))


def wall_tables(runs):
    sizes = sorted(runs)
    doc = ["## Wall times and memory (native runs, medians; indicative only)\n\n"]
    rows = []
    for s in sizes:
        lab = by_label(runs[s])
        mem = lab.get("memory at end", {})
        start = lab.get("memory after start", {})
        fc = lab.get("ei Vexlan_FCHBA_FCPort", {})
        pp = lab.get("ei Vexlan_Adapter_PhysicalPort", {})
        rows.append([s, start.get("rss_kib", "-"), mem.get("hwm_kib", "-"),
                     "%.0f" % fc["wall_us"] if "wall_us" in fc else "-",
                     "%.0f" % pp["wall_us"] if "wall_us" in pp else "-"])
    doc.append(table(["adapters", "resident after start (KiB)", "peak resident (KiB)",
                      "ei FCPort (µs)", "ei PhysicalPort (µs)"], rows))
    return "".join(doc)


def plot(runs, png, work):
    if not shutil.which("gnuplot"):
        return False
    sizes = sorted(runs)
    classes = list_classes(runs)
    data = os.path.join(work, "plot.dat")
    with open(data, "w") as f:
        for c in classes:
            f.write("# %s\n" % c)
            for s in sizes:
                r = by_label(runs[s]).get("ei " + c)
                if r and "split" in r:
                    f.write("%d %f\n" % (s, per_instance_total(r)))
            f.write("\n\n")
    plots = ", ".join("'%s' index %d with linespoints title '%s'" % (data, i, c.replace("Vexlan_", ""))
                      for i, c in enumerate(classes))
    script = ("set terminal png size 1000,640 noenhanced\n"
              "set output '%s'\nset logscale x 2\nset xtics (%s)\nset xlabel 'adapters (4 FC functions each)'\n"
              "set ylabel 'instructions per enumerated instance'\nset key outside right\nset yrange [0:*]\n"
              "set title 'EnumerateInstances: cost per instance against host size'\nplot %s\n"
              % (png, ", ".join(str(s) for s in sizes), plots))
    subprocess.run(["gnuplot"], input=script, universal_newlines=True, check=True)
    return True


def machine():
    cpu = "unknown CPU"
    try:
        with open("/proc/cpuinfo") as f:
            for line in f:
                if line.startswith("model name"):
                    cpu = line.split(":", 1)[1].strip()
                    break
    except OSError:
        pass
    return "%s, %d cores, %s %s" % (cpu, os.cpu_count() or 0, platform.system(), platform.release())


def commit(given=None):
    if given:
        return given
    try:
        rev = subprocess.run(["git", "-C", ROOT, "rev-parse", "--short", "HEAD"], stdout=subprocess.PIPE,
                             universal_newlines=True).stdout.strip()
        # The page and plot this run writes are not changes to what it measures.
        dirty = subprocess.run(["git", "-C", ROOT, "status", "--porcelain", "--untracked-files=no", "--", ".",
                                ":!docs/performance.md", ":!docs/performance.png"],
                               stdout=subprocess.PIPE, universal_newlines=True).stdout.strip()
        return rev + (" (with uncommitted changes)" if dirty else "")
    except OSError:
        return "unknown"


def kept(out, begin, end):
    """The text between two marks of the document a run is about to replace."""
    if not os.path.exists(out):
        return None
    with open(out) as f:
        text = f.read()
    b, e = text.find(begin), text.find(end)
    if b < 0 or e < 0:
        return None
    return text[b + len(begin):e].strip("\n")


def main():
    ap = argparse.ArgumentParser()
    ap.add_argument("--build", required=True)
    ap.add_argument("--sizes", default="1,16,256,1024")
    ap.add_argument("--mixed", default="16", help="adapters of the mixed host (half CNAs)")
    ap.add_argument("--out", default=os.path.join(ROOT, "docs", "performance.md"))
    ap.add_argument("--repeat", type=int, default=5)
    ap.add_argument("--no-callgrind", action="store_true")
    ap.add_argument("--check", action="store_true")
    ap.add_argument("--as-before", action="store_true")
    ap.add_argument("--work", default=None)
    ap.add_argument("--commit", default=None, help="the commit measured, when the build is of another tree")
    ap.add_argument("--walks-only", action="store_true",
                    help="count only the fixed cost and the walks; print their table")
    ap.add_argument("--provider", default=None, help="the provider library to load instead of the build's")
    ap.add_argument("--walk-sizes", default="16,64,256,1024",
                    help="sizes (adapters) of the runs that count only the walks, for their table; "
                         "empty: the walks of the full runs")
    args = ap.parse_args()
    build = os.path.abspath(args.build)
    sizes = [int(s) for s in args.sizes.split(",") if s]
    mixed = [int(s) for s in args.mixed.split(",") if s]
    work = args.work or tempfile.mkdtemp(prefix="vexlan-bench.")
    counted = not args.no_callgrind

    fc_runs, fc_wall, mixed_runs = {}, {}, {}
    if args.walks_only:
        for s in sizes:
            print("run_bench: %d adapters under callgrind, walks only" % s, flush=True)
            fc_runs[s] = run_driver(build, os.path.join(work, "fc-%d-walks" % s), describe("fc", s), True, 1,
                                    walks_only=True, provider=args.provider)
        print(walk_table(fc_runs))
        if not args.work:
            shutil.rmtree(work, ignore_errors=True)
        return
    for s in sizes:
        desc = describe("fc", s)
        if counted:
            print("run_bench: %d adapters under callgrind" % s, flush=True)
            fc_runs[s] = run_driver(build, os.path.join(work, "fc-%d-cg" % s), desc, True, 1)
        print("run_bench: %d adapters natively" % s, flush=True)
        fc_wall[s] = run_driver(build, os.path.join(work, "fc-%d" % s), desc, False, args.repeat)
    # The walks' table comes from runs of their own, the same requests in the
    # same order at every size (in the full runs the fixed cost of a request
    # also depends on what ran before it).
    walk_runs = {}
    if counted:
        for s in [int(x) for x in args.walk_sizes.split(",") if x]:
            print("run_bench: %d adapters under callgrind, walks only" % s, flush=True)
            walk_runs[s] = run_driver(build, os.path.join(work, "fc-%d-walks" % s), describe("fc", s), True, 1,
                                      walks_only=True)
    for s in mixed:
        desc = describe("mixed", s)
        print("run_bench: mixed host of %d adapters%s" % (s, " under callgrind" if counted else ""), flush=True)
        mixed_runs[s] = run_driver(build, os.path.join(work, "mixed-%d" % s), desc, counted, 1)

    if args.check:
        failed = [(s, r["label"], r["rc"]) for runs in (fc_wall, mixed_runs) for s in runs for r in runs[s]
                  if r.get("rc", 0) != 0]
        empty = [s for s in fc_wall if not list_classes({s: fc_wall[s]})]
        if failed or empty:
            raise SystemExit("run_bench: failed requests %s, sizes without listed classes %s" % (failed, empty))

    png_name = os.path.splitext(os.path.basename(args.out))[0] + ".png"
    out = args.out if not args.check else os.path.join(work, "performance.md")
    png = os.path.join(os.path.dirname(os.path.abspath(out)), png_name)

    body = []
    if counted:
        body.append(scenario_tables("FC host: adapters of 4 FC functions", fc_runs, True, walk_runs))
        if mixed_runs:
            body.append("\n" + scenario_tables("Mixed host: CNAs (FCoE and NIC functions) and FC HBAs",
                                               mixed_runs, True))
    body.append("\n" + wall_tables(fc_wall))
    current = "".join(body)
    plotted = counted and plot(fc_runs, png, work)

    before = kept(args.out, BEFORE_BEGIN, BEFORE_END)
    server = kept(args.out, SERVER_BEGIN, SERVER_END)
    if args.as_before or before is None:
        before = "Measured at commit %s.\n\n%s" % (commit(args.commit), current)
    header = ("# Performance\n\n"
              "Written by `make bench` (bench/run_bench.py driving bench/vexlan_bench); do not edit by hand.\n\n"
              "- Machine: %s\n- Commit: %s\n- Date: %s\n- Sizes: %s adapters of 4 FC functions "
              "(the first adapter of the default description as the template); walks from one element: %s; "
              "mixed host: %s adapters, half of them CNAs\n\n"
              "Instruction counts come from callgrind and cover everything under the provider's own functions "
              "during one request: *broker build* is what its calls into the host cost other than handing "
              "results over, *host delivery* the host's returnData, returnInstance, returnObjectPath and "
              "returnDone, *adapter library* its calls into libzorap_cna_provider, and *provider own* the rest "
              "(its code and the C and C++ library calls it makes itself). FCPort, FCPortStatistics, StorageExtent "
              "and SCSIProtocolEndpointTarget requests include the rebuild of their list.\n\n"
              % (machine(), commit(args.commit), datetime.datetime.utcnow().strftime("%Y-%m-%d %H:%M UTC"),
                 ", ".join(map(str, sizes)),
                 ", ".join(map(str, sorted(walk_runs))) + " adapters, in runs of their own" if walk_runs
                 else "in the full runs",
                 ", ".join(map(str, mixed))))
    if plotted:
        header += "![cost per enumerated instance against host size](%s)\n\n" % png_name
    doc = header + "# Now\n\n" + current
    if server:
        doc += "\n# In a real server\n\n" + SERVER_BEGIN + "\n" + server + "\n" + SERVER_END + "\n"
    doc += "\n# Before\n\n" + BEFORE_BEGIN + "\n" + before + "\n" + BEFORE_END + "\n"
    with open(out, "w") as f:
        f.write(doc)
    print("run_bench: wrote %s" % (out if not args.check else "a checked document"))
    if not args.work:
        shutil.rmtree(work, ignore_errors=True)


if __name__ == "__main__":
    main()
