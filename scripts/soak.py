#!/usr/bin/env python3
"""A soak of the installed provider in a running CIM server (not part of make test).

For --duration seconds, against the server at --url:
  - --clients clients (8) loop over every request kind of every class and
    association of the provider (classes.tsv of the installation): for each
    instance class enumerateInstanceNames, enumerateInstances, getInstance,
    associatorNames, associators, referenceNames and references of its first
    instance (the last four in the provider's namespace only; in the interop
    namespace the server's own provider answers them); for each association
    class the three instance requests;
  - InstallFromURI jobs (InstallOptions 5,32768) one after another, FC and
    NIC in turn, each followed until its JobState ends;
  - subscriptions to the provider's three indication classes switched on and
    off, with scripts/cimxml_listener.py receiving;
  - the adapter description rewritten: an FC port state every --link-every
    seconds, a NIC link state every 6th time, a configuration change (the last
    adapter removed or put back) every --config-every seconds;
  - the provider process's resident memory and thread count sampled every
    minute.
Then it prints a report. Needs wbemcli (sblim-wbemcli) and Python 3.

  scripts/soak.py --url http://localhost:5988 --interop root/PG_InterOp \\
      --prefix /opt/vexlan-pg --process-exe /path/of/cimprovagt --duration 1800
  scripts/soak.py --url http://localhost:15988 --interop root/interop \\
      --prefix /opt/vexlan-sfcb --process-exe /path/of/sfcbd --duration 1800

The description file (beside the installed adapter library unless
--description says otherwise) is restored at the end. The server should read
a LinkStatusPollIntervalSeconds of a few seconds (vexlancna.properties in the
working directory of the process that runs the provider), so link changes and
configuration changes show soon. The report names that directory and the
interval it found there: with the default of 180 seconds most FC alerts are
lost, because every edit of the description made while a configuration
change waits for the next poll counts as part of that change, port states
included, and the rebuild at the poll takes them in without an alert. sfcbd
started as a daemon, or through nsenter, runs in "/".

Classes marked for the interop namespace are asked there only when the
server has them there (sfcb; OpenPegasus's own interop provider serves that
namespace and gets no class of the provider).
"""

import argparse
import collections
import json
import os
import random
import re
import signal
import subprocess
import sys
import tempfile
import threading
import time

ENDED_JOB_STATES = {"7": "completed", "8": "terminated", "9": "killed", "10": "exception"}
INDICATION_CLASSES = ["VexlanCNA_AlertIndication_AdapterStatusChange",
                      "Vexlan_NIC_IndicationEthernetPortLinkDown",
                      "Vexlan_NIC_IndicationEthernetPortLinkUp"]


class Soak:
    def __init__(self, a):
        self.a = a
        self.url = a.url.rstrip("/")
        self.hostport = re.sub(r"^https?://", "", self.url)
        self.stop = threading.Event()
        self.lock = threading.Lock()
        self.served = collections.Counter()      # request kind -> count
        self.errors = collections.Counter()      # (kind, class, text) -> count
        self.gone = collections.Counter()        # (kind, class): NOT_FOUND of a path just enumerated
        self.jobs = collections.Counter()
        self.changes = collections.Counter()
        self.subscriptions = collections.Counter()
        self.subscribed = False
        self.samples = []
        self.rows = None
        self.not_in_interop = []
        self.settings = "?"
        self.start = time.time()

    # ------------------------------------------------------------ requests
    def wbemcli(self, *args, timeout=120):
        try:
            p = subprocess.run(["wbemcli", "-noverify"] + list(args), capture_output=True, text=True,
                               timeout=timeout)
            out = p.stdout + p.stderr
            failed = p.returncode != 0 or "* wbemcli:" in out
            return (not failed), out
        except subprocess.TimeoutExpired:
            return False, "timed out after %d s" % timeout

    def request(self, kind, cls, *args):
        ok, out = self.wbemcli(kind, *args)
        with self.lock:
            self.served[kind] += 1
            if not ok:
                text = out.strip().splitlines()[-2 if out.strip().count("\n") else -1][:160] if out.strip() else "?"
                if "CIM_ERR_NOT_FOUND" in out and kind not in ("ein", "ei"):
                    self.gone[(kind, cls)] += 1
                else:
                    self.errors[(kind, cls, text)] += 1
        return ok, out

    def classes(self):
        """(class, namespace, association) of every instance class; the rows
        of the interop namespace only for the classes the server has there
        (OpenPegasus gets none: its own interop provider serves that
        namespace), found once."""
        if self.rows is not None:
            return list(self.rows)
        table = os.path.join(self.a.prefix, "share", "vexlan-cna", "classes.tsv")
        rows = []
        with open(table) as f:
            for line in f:
                if line.startswith("#") or not line.strip():
                    continue
                cols = line.rstrip("\n").split("\t")
                kinds = cols[3].split()
                if "instance" not in kinds:
                    continue
                rows.append((cols[0], self.a.namespace, "association" in kinds))
                if "interop" in cols[1].split():
                    ok, out = self.wbemcli("gc", "%s/%s:%s" % (self.url, self.a.interop, cols[0]))
                    if ok:
                        rows.append((cols[0], self.a.interop, "association" in kinds))
                    else:
                        self.not_in_interop.append(cols[0])
        self.rows = rows
        return list(rows)

    def settings_in_effect(self):
        """The working directory of the provider process and the
        LinkStatusPollIntervalSeconds its settings file there gives (the
        provider reads vexlancna.properties of its working directory; 180
        seconds without one)."""
        pids = self.provider_pids()
        if not pids:
            return "no provider process found"
        pid = pids[0]
        try:
            cwd = os.readlink("/proc/%d/cwd" % pid)
        except OSError as e:
            return "working directory of %d unknown (%s)" % (pid, e)
        interval = None
        try:
            with open("/proc/%d/cwd/vexlancna.properties" % pid) as f:
                for word in f.read().split():
                    if word.lower().startswith("linkstatuspollintervalseconds"):
                        value = word[len("LinkStatusPollIntervalSeconds"):].lstrip("= \t")
                        interval = value
        except OSError:
            return "working directory %s, no vexlancna.properties there: polls every 180 s" % cwd
        if interval is None:
            text = "working directory %s, its vexlancna.properties sets no poll interval: polls every 180 s" % cwd
        else:
            text = "working directory %s, LinkStatusPollIntervalSeconds=%s" % (cwd, interval)
        return text + self.description_in_use(pid)

    def description_in_use(self, pid):
        """A warning when the provider process reads another description
        than the one this run rewrites: the adapter library it maps looks
        for the file beside itself (or where ZORAP_SIM_ADAPTERS says)."""
        try:
            with open("/proc/%d/environ" % pid, "rb") as f:
                env = dict(v.split(b"=", 1) for v in f.read().split(b"\0") if b"=" in v)
            if env.get(b"ZORAP_SIM_ADAPTERS"):
                used = env[b"ZORAP_SIM_ADAPTERS"].decode(errors="replace")
            else:
                with open("/proc/%d/maps" % pid) as f:
                    libs = {l.split()[-1] for l in f if "libzorap_cna_provider" in l}
                if not libs:
                    return ""
                used = os.path.join(os.path.dirname(sorted(libs)[0]), "zorap_sim_adapters.json")
        except OSError:
            return ""
        if os.path.realpath(used) == os.path.realpath(self.a.description):
            return ""
        return "; WARNING: the provider reads the description %s, this run rewrites %s" % (used, self.a.description)

    def client(self, number):
        rows = self.classes()
        random.Random(number).shuffle(rows)
        while not self.stop.is_set():
            for cls, ns, association in rows:
                if self.stop.is_set():
                    return
                base = "%s/%s:%s" % (self.url, ns, cls)
                ok, out = self.request("ein", cls, base)
                self.request("ei", cls, base)
                paths = [l.strip() for l in out.splitlines() if ":" + cls + "." in l] if ok else []
                if not paths:
                    continue
                path = "http://" + paths[0]
                self.request("gi", cls, path)
                # In the interop namespace the server's own interop provider
                # answers the association requests (OpenPegasus refuses them
                # for classes it doesn't know): walked in the provider's only.
                if association or ns != self.a.namespace:
                    continue
                for kind in ("ain", "ai", "rin", "ri"):
                    self.request(kind, cls, path)

    # ------------------------------------------------------------ jobs
    def first_path(self, cls):
        ok, out = self.wbemcli("ein", "%s/%s:%s" % (self.url, self.a.namespace, cls))
        lines = [l.strip() for l in out.splitlines() if ":" + cls + "." in l]
        return lines[0] if ok and lines else None

    def jobs_loop(self):
        image = os.path.join(self.a.work, "image.bin")
        with open(image, "wb") as f:
            f.write(os.urandom(65536))
        nic = False
        while not self.stop.is_set():
            nic = not nic
            service = self.first_path("Vexlan_NIC_SoftwareInstallationService" if nic
                                      else "Vexlan_FCHBA_SoftwareInstallationService")
            target = self.first_path("Vexlan_NIC_PortController" if nic else "Vexlan_FCHBA_PortController")
            if not service or not target:
                self.jobs["no service or target"] += 1
                self.stop.wait(5)
                continue
            target = re.sub(r"^[^/]*/", "", target)  # namespace:class.keys
            ok, out = self.wbemcli("cm", "http://" + service,
                                   'InstallFromURI.URI="file://%s",Target=%s,InstallOptions=5,32768' % (image, target))
            m = re.search(r"InstallFromURI: (\d+)", out)
            value = m.group(1) if m else "none"
            with self.lock:
                self.served["cm"] += 1
            job = re.search(r"Job \(reference\): (\S+)", out)
            if value != "4096" or not job:
                self.jobs["refused (value %s)" % value] += 1
                self.stop.wait(self.a.job_pause)
                continue
            self.jobs["started"] += 1
            state, until = None, time.time() + 600
            while time.time() < until and not self.stop.is_set():
                ok, got = self.wbemcli("gi", "http://%s/%s" % (self.hostport, job.group(1)))
                with self.lock:
                    self.served["gi"] += 1
                m = re.search(r"JobState=(\d+)", got)
                state = m.group(1) if m else None
                if state in ENDED_JOB_STATES:
                    break
                time.sleep(1)
            if state in ENDED_JOB_STATES or not self.stop.is_set():
                self.jobs["ended " + ENDED_JOB_STATES.get(state, "not (state %s)" % state)] += 1
            else:
                self.jobs["still running at the end"] += 1
            self.stop.wait(self.a.job_pause)

    # ------------------------------------------------------------ subscriptions
    def interop_path(self, cls, name):
        return ('%s/%s:%s.CreationClassName="%s",SystemCreationClassName="CIM_ComputerSystem",SystemName="%s",'
                'Name="%s"' % (self.url, self.a.interop, cls, cls, self.a.hostname, name))

    def keys(self, cls, name):
        return ('CreationClassName="%s",SystemCreationClassName="CIM_ComputerSystem",SystemName="%s",Name="%s"'
                % (cls, self.a.hostname, name))

    def ref(self, cls, name):
        return "localhost/%s:%s.%s" % (self.a.interop, cls, self.keys(cls, name))

    def subscribe(self, on):
        handler = "SoakListener"
        if on:
            for i, ind in enumerate(INDICATION_CLASSES):
                filt = "SoakFilter%d" % i
                ok, _ = self.wbemcli("ci", "%s/%s:CIM_IndicationSubscription.Filter=%s,Handler=%s" % (
                    self.url, self.a.interop, self.ref("CIM_IndicationFilter", filt),
                    self.ref("CIM_ListenerDestinationCIMXML", handler)),
                    "SubscriptionState=2,Filter=%s,Handler=%s" % (
                    self.ref("CIM_IndicationFilter", filt), self.ref("CIM_ListenerDestinationCIMXML", handler)))
                self.subscriptions["created" if ok else "create failed"] += 1
        else:
            ok, out = self.wbemcli("ein", "%s/%s:CIM_IndicationSubscription" % (self.url, self.a.interop))
            for line in out.splitlines():
                if handler.lower() in line.lower():
                    ok2, _ = self.wbemcli("di", "http://" + line.strip())
                    self.subscriptions["deleted" if ok2 else "delete failed"] += 1

    def setup_indications(self):
        for i, ind in enumerate(INDICATION_CLASSES):
            name = "SoakFilter%d" % i
            self.wbemcli("ci", self.interop_path("CIM_IndicationFilter", name),
                         self.keys("CIM_IndicationFilter", name) +
                         ',Query="SELECT * FROM %s",QueryLanguage="WQL",SourceNamespace="%s"' % (ind, self.a.namespace))
        self.wbemcli("ci", self.interop_path("CIM_ListenerDestinationCIMXML", "SoakListener"),
                     self.keys("CIM_ListenerDestinationCIMXML", "SoakListener") +
                     ',Destination="http://127.0.0.1:%d"' % self.a.listener_port)

    def teardown_indications(self):
        self.subscribe(False)
        for i in range(len(INDICATION_CLASSES)):
            self.wbemcli("di", self.interop_path("CIM_IndicationFilter", "SoakFilter%d" % i))
        self.wbemcli("di", self.interop_path("CIM_ListenerDestinationCIMXML", "SoakListener"))

    def subscriptions_loop(self):
        while not self.stop.is_set():
            self.subscribe(True)
            with self.lock:
                self.subscribed = True
            self.stop.wait(self.a.subscribed_for)
            with self.lock:
                self.subscribed = False
            self.subscribe(False)
            self.stop.wait(self.a.unsubscribed_for)

    # ------------------------------------------------------------ description
    def write_description(self, doc):
        fd, tmp = tempfile.mkstemp(dir=os.path.dirname(self.a.description), prefix=".soak-")
        with os.fdopen(fd, "w") as f:
            json.dump(doc, f, indent=1)
        os.chmod(tmp, 0o644)
        os.rename(tmp, self.a.description)

    def description_loop(self, original):
        doc = json.loads(original)
        doc.setdefault("flash", {})["durationMs"] = 3000
        fc, nics, index = [], [], 0
        for adapter in doc["adapters"]:
            for port in adapter.get("ports", []):
                for proto in port.get("protocols", []):
                    if proto.get("type") in ("fc", "fcoe"):
                        proto["portIndex"] = index     # each alarm names one port
                        index += 1
                        fc.append(proto)
                    elif proto.get("type") == "nic":
                        nics.append(proto)
        removed = None
        self.write_description(doc)
        last_config, turn = time.time(), 0
        while not self.stop.wait(self.a.link_every):
            turn += 1
            kind = "configuration"
            if time.time() - last_config >= self.a.config_every:
                if removed is None and len(doc["adapters"]) > 1:
                    removed = doc["adapters"].pop()
                elif removed is not None:
                    doc["adapters"].append(removed)
                    removed = None
                last_config = time.time()
            elif turn % 6 == 0 and nics:
                nic = nics[(turn // 6) % len(nics)]
                nic["linkState"] = "down" if nic.get("linkState", "up") == "up" else "up"
                kind = "NIC link"
            else:
                live = [p for p in fc if removed is None or not any(
                    p is q for port in removed.get("ports", []) for q in port.get("protocols", []))]
                port = live[turn % len(live)]
                port["state"] = "loopdown" if port.get("state", "online") == "online" else "online"
                kind = "FC port state"
            self.write_description(doc)
            with self.lock:
                self.changes[kind] += 1
                if self.subscribed:
                    self.changes[kind + " while subscribed"] += 1

    # ------------------------------------------------------------ the provider process
    def provider_pids(self):
        pids = []
        for d in os.listdir("/proc"):
            if not d.isdigit():
                continue
            try:
                if not os.readlink("/proc/%s/exe" % d).startswith(self.a.process_exe):
                    continue
                # sfcb's provider processes don't keep their own names: the
                # process that maps the provider library is the one.
                with open("/proc/%s/maps" % d) as f:
                    if self.a.process_library in f.read():
                        pids.append(int(d))
            except OSError:
                continue
        return pids

    def sample(self):
        rows = []
        for pid in self.provider_pids():
            try:
                with open("/proc/%d/status" % pid) as f:
                    status = dict(l.split(":", 1) for l in f if ":" in l)
                rows.append((pid, int(status["VmRSS"].split()[0]), int(status["Threads"])))
            except (OSError, KeyError, ValueError):
                pass
        with self.lock:
            self.samples.append((int((time.time() - self.start) / 60), rows, sum(self.served.values())))
            sys.stderr.write("soak: minute %d, requests %d, errors %d, jobs %s, provider %s\n" % (
                self.samples[-1][0], self.samples[-1][2], sum(self.errors.values()), dict(self.jobs), rows))
            sys.stderr.flush()

    # ------------------------------------------------------------ run
    def run(self):
        os.makedirs(self.a.work, exist_ok=True)
        with open(self.a.description) as f:
            original = f.read()
        listener_out = open(os.path.join(self.a.work, "indications.jsonl"), "w")
        listener = subprocess.Popen([sys.executable, os.path.join(os.path.dirname(os.path.abspath(__file__)),
                                                                  "cimxml_listener.py"),
                                     "--port", str(self.a.listener_port), "--json"],
                                    stdout=listener_out, stderr=subprocess.DEVNULL)
        threads = []
        try:
            # The provider is loaded first, by one request, before the
            # subscriptions and the clients come at once.
            self.wbemcli("ein", "%s/%s:Vexlan_Adapter_ComputerSystem" % (self.url, self.a.namespace))
            self.settings = self.settings_in_effect()
            sys.stderr.write("soak: provider settings: %s\n" % self.settings)
            self.classes()
            time.sleep(self.a.warm_up)
            self.teardown_indications()
            self.setup_indications()
            self.sample()
            # The subscriptions first, the load after them.
            subscriptions = threading.Thread(target=self.subscriptions_loop, daemon=True)
            subscriptions.start()
            threads.append(subscriptions)
            time.sleep(self.a.warm_up)
            workers = [threading.Thread(target=self.client, args=(i,), daemon=True) for i in range(self.a.clients)]
            workers += [threading.Thread(target=self.jobs_loop, daemon=True)]
            workers.append(threading.Thread(target=self.description_loop, args=(original,), daemon=True))
            for t in workers:
                t.start()
                threads.append(t)
            end = self.start + self.a.duration
            next_sample = self.start + 60
            while time.time() < end:
                time.sleep(min(1.0, max(0.0, end - time.time())))
                if time.time() >= next_sample:
                    self.sample()
                    next_sample += 60
        finally:
            self.stop.set()
            # Requests under way end within their own timeout; a job being
            # followed is left to the server.
            deadline = time.time() + 150
            for t in threads:
                t.join(timeout=max(0.0, deadline - time.time()))
            with open(self.a.description, "w") as f:
                f.write(original)
            self.teardown_indications()
            time.sleep(3)
            self.sample()
            listener.terminate()
            listener.wait()
            listener_out.close()
        self.report()

    def report(self):
        received = collections.Counter()
        with open(os.path.join(self.a.work, "indications.jsonl")) as f:
            for line in f:
                try:
                    received[json.loads(line).get("className", "?")] += 1
                except ValueError:
                    received["unreadable"] += 1
        minutes = (time.time() - self.start) / 60
        p = print
        p("soak report: %s, namespaces %s and %s, %.1f minutes, %d clients" % (
            self.url, self.a.namespace, self.a.interop, minutes, self.a.clients))
        p("provider settings: %s" % self.settings)
        if self.not_in_interop:
            p("classes not asked in %s (the server has no such class there): %d" % (
                self.a.interop, len(self.not_in_interop)))
        p("requests served: %d (%s)" % (sum(self.served.values()),
                                         ", ".join("%s %d" % kv for kv in sorted(self.served.items()))))
        p("errors: %d" % sum(self.errors.values()))
        for (kind, cls, text), n in sorted(self.errors.items()):
            p("  %d x %s %s: %s" % (n, kind, cls, text))
        # A rebuild between the enumeration and the request removes an
        # instance; the getInstance of an association whose ends are checked
        # by other classes' lookups finds no end every time.
        p("CIM_ERR_NOT_FOUND for a path just enumerated (a rebuild in between, or an association's check of its ends): %d"
          % sum(self.gone.values()))
        for (kind, cls), n in sorted(self.gone.items()):
            p("  %d x %s %s" % (n, kind, cls))
        p("description changes made: %s" % ", ".join("%s %d" % kv for kv in sorted(self.changes.items())))
        p("subscriptions: %s" % ", ".join("%s %d" % kv for kv in sorted(self.subscriptions.items())))
        p("indications received: %d (%s)" % (sum(received.values()),
                                             ", ".join("%s %d" % kv for kv in sorted(received.items()))))
        p("jobs: %s" % ", ".join("%s %d" % kv for kv in sorted(self.jobs.items())))
        p("provider process (%s, %s), per minute: minute pid RSS-KiB threads requests-so-far" % (
            self.a.process_exe, self.a.process_library))
        for minute, rows, served in self.samples:
            if not rows:
                p("  %3d  (no provider process)  %d" % (minute, served))
            for pid, rss, threads in rows:
                p("  %3d  %d  %d  %d  %d" % (minute, pid, rss, threads, served))


def main():
    ap = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    ap.add_argument("--url", required=True, help="http://host:port of the server")
    ap.add_argument("--namespace", default="root/vexlan_cmpi")
    ap.add_argument("--interop", required=True, help="root/PG_InterOp (OpenPegasus), root/interop (sfcb)")
    ap.add_argument("--prefix", required=True, help="installation prefix of the provider")
    ap.add_argument("--description", help="adapter description file (default: beside the installed library)")
    ap.add_argument("--process-exe", required=True, help="path (prefix) of the provider process's executable")
    ap.add_argument("--process-library", default="libVexlan_CNA_Provider",
                    help="the library the provider process maps (libVexlan_CNA_Provider)")
    ap.add_argument("--duration", type=int, default=1800, help="seconds (1800)")
    ap.add_argument("--clients", type=int, default=8)
    ap.add_argument("--listener-port", type=int, default=5990)
    ap.add_argument("--hostname", default=os.uname().nodename, help="SystemName of filters and destinations")
    ap.add_argument("--link-every", type=float, default=5.0, help="seconds between live-state changes (5)")
    ap.add_argument("--config-every", type=float, default=180.0, help="seconds between configuration changes (180)")
    ap.add_argument("--job-pause", type=float, default=10.0, help="seconds between jobs (10)")
    ap.add_argument("--subscribed-for", type=float, default=120.0)
    ap.add_argument("--unsubscribed-for", type=float, default=30.0)
    ap.add_argument("--warm-up", type=float, default=5.0,
                    help="seconds between the first request and the rest (5; 0 brings everything at once)")
    ap.add_argument("--work", default=None, help="directory for the image and the listener's output")
    a = ap.parse_args()
    if not a.description:
        a.description = os.path.join(a.prefix, "lib", "zorap_sim_adapters.json")
    if not a.work:
        a.work = tempfile.mkdtemp(prefix="vexlan-soak-", dir="/tmp")
    # A SIGTERM ends the run like its end: the description is put back.
    signal.signal(signal.SIGTERM, lambda *_: sys.exit(143))
    Soak(a).run()


if __name__ == "__main__":
    main()
