#!/usr/bin/env python3
"""End-to-end checks of the tarnstats binary, run by CTest.

    check_tool.py --tool BINARY MODE [options] [-- TOOL ARGUMENTS...]

Modes:
  expect       run the tool once; check its exit status, and optionally its whole stdout against
               a golden file (--golden; TARNSTATS_UPDATE_GOLDEN=1 rewrites the file instead), lines
               it must print (--stdout-line; --stdout-row compares the words of a table row), that
               it prints nothing (--stdout-empty), and its stderr (--stderr-line: stderr is exactly
               these lines; --stderr-prefix: one line starting so; --stderr-has: stderr holds
               this line among others; --stderr-empty).
  list-json    `list --json` parsed back and checked by the catalogue's rules, and against `list`.
  get-json     `get --json ARGS` parsed back and checked against the request and `list --json`,
               and against the table output of the same request.
  prometheus   `get --prometheus ARGS` checked with `promtool check metrics` (no finding at all)
               and parsed; each request is also run alone and its samples compared with the JSON
               values converted to base units (computed here in exact decimal arithmetic).
  host-values  every stat with every instance on the host file --host: the instances must be those
               the file describes, in its order, and each value the file gives must come back.
  doc          the examples of a Markdown file (--doc): each "$ tarnstats ..." line of a ```console
               block is run (in a directory holding the first ```json block of the file, or of
               --json-doc, as host.json)
               and its stdout and stderr must be the lines that follow, up to the next command;
               a last line "(exit status N)" gives the status expected (0 otherwise).
Exit status 0 when every check passes; otherwise the failures are printed and the status is 1.
"""

import argparse
import decimal
import json
import os
import re
import shlex
import subprocess
import sys
import tempfile

FAILURES = []


def fail(message):
    FAILURES.append(message)


def check(condition, message):
    if not condition:
        fail(message)
    return condition


def run(tool, args, host=None):
    command = [tool] + (["--host", host] if host else []) + list(args)
    result = subprocess.run(command, stdout=subprocess.PIPE, stderr=subprocess.PIPE, timeout=240)
    return result.returncode, result.stdout.decode("utf-8", "replace"), result.stderr.decode("utf-8", "replace")


def run_ok(tool, args, host=None):
    status, out, err = run(tool, args, host)
    check(status == 0, "%s exited with %d: %s" % (" ".join(args), status, err.strip()))
    return out


def split_requests(args):
    """The requests of a get command line: the positional one and each -r group."""
    requests, current = [], []
    for word in args:
        if word in ("-r", "--request"):
            if current:
                requests.append(current)
            current = []
        elif not word.startswith("--"):
            current.append(word)
    if current:
        requests.append(current)
    return requests


# --- expect -------------------------------------------------------------------------------------

def mode_expect(opts, args):
    status, out, err = run(opts.tool, args)
    check(status == opts.status, "exit status %d, expected %d (stderr: %r)" % (status, opts.status, err))
    if opts.golden:
        if os.environ.get("TARNSTATS_UPDATE_GOLDEN") == "1":
            with open(opts.golden, "w", encoding="utf-8") as f:
                f.write(out)
        else:
            with open(opts.golden, encoding="utf-8") as f:
                expected = f.read()
            if out != expected:
                got, want = out.splitlines(), expected.splitlines()
                for i in range(max(len(got), len(want))):
                    g = got[i] if i < len(got) else "<missing>"
                    w = want[i] if i < len(want) else "<missing>"
                    if g != w:
                        fail("stdout differs from %s at line %d:\n  got:      %r\n  expected: %r" % (opts.golden, i + 1, g, w))
                        break
    out_lines = out.splitlines()
    for line in opts.stdout_line:
        check(line in out_lines, "stdout lacks the line %r:\n%s" % (line, out))
    rows = [line.split() for line in out_lines]
    for row in opts.stdout_row:
        check(row.split() in rows, "stdout lacks the row %r:\n%s" % (row, out))
    if opts.stdout_empty:
        check(out == "", "stdout should be empty, got %r" % out)
    err_lines = err.splitlines()
    if opts.stderr_empty:
        check(err == "", "stderr should be empty, got %r" % err)
    if opts.stderr_prefix:
        check(len(err_lines) == 1 and err_lines[0].startswith(opts.stderr_prefix),
              "stderr is %r, expected one line starting with %r" % (err_lines, opts.stderr_prefix))
    if opts.stderr_line:
        check(err_lines == opts.stderr_line, "stderr is %r, expected exactly %r" % (err_lines, opts.stderr_line))
    for line in opts.stderr_has:
        check(line in err_lines, "stderr lacks the line %r: %r" % (line, err_lines))


# --- list-json ----------------------------------------------------------------------------------

UNIT_TEXTS = {"percent", "kiloBytes", "megaBytes", "megaHertz", "number", "microsecond", "millisecond", "second",
              "kiloBytesPerSecond", "megaBytesPerSecond", "watt", "joule"}
OBJECT_TYPES = {"VM", "vCpu", "vNic", "vDisk", "vmLUN", "host", "pCpu", "pNic", "storageAdapter", "storagePath",
                "hostLUN", "datastore", "LUN"}


def load_list(tool):
    return json.loads(run_ok(tool, ["list", "--json"]))["stats"]


def mode_list_json(opts, _args):
    stats = load_list(opts.tool)
    check(len(stats) == 70, "list --json gives %d stats, expected 70" % len(stats))
    pairs = set()
    for i, s in enumerate(stats):
        where = "stat %s" % s.get("id")
        check(s["id"] == i, "%s at position %d" % (where, i))
        check((s["name"], s["objectType"]) not in pairs, "%s repeats %s@%s" % (where, s["name"], s["objectType"]))
        pairs.add((s["name"], s["objectType"]))
        check(s["request"] == "%s@%s" % (s["name"], s["objectType"]), "%s: request %r" % (where, s["request"]))
        check(s["objectType"] in OBJECT_TYPES, "%s: object type %r" % (where, s["objectType"]))
        check(s["unit"] in UNIT_TEXTS, "%s: unit %r" % (where, s["unit"]))
        check(s["valueType"] in ("absolute", "delta", "rate"), "%s: value type %r" % (where, s["valueType"]))
        # The catalogue sums the delta stats and averages all others.
        check(s["rollupType"] == ("summation" if s["valueType"] == "delta" else "average"),
              "%s: rollup %r for a %s stat" % (where, s["rollupType"], s["valueType"]))
        check(s["label"] and s["description"], "%s: empty label or description" % where)
        attrs = s["attributes"]
        check(len(attrs) <= 2, "%s: %d attributes" % (where, len(attrs)))
        for k, a in enumerate(attrs):
            check(a["allowWildCard"] is True, "%s: attribute %d takes no wildcard" % (where, k))
            vm_like = a["idMapType"] in ("VM moid to world id", "VM moid to world group id", "VM moid")
            check(a["attrType"] == ("vm" if vm_like else "unknown type"), "%s: attribute %d attrType %r" % (where, k, a["attrType"]))
            if a["idMapType"] == "vNic to port id":
                check(k > 0 and attrs[k - 1]["name"] == "vm" and attrs[k - 1]["idMapType"] == "VM moid",
                      "%s: a vNIC port level without the VM level before it" % where)
            if a["idMapType"] == "vDisk to vScsi handle":
                check(k > 0 and attrs[k - 1]["attrType"] == "vm", "%s: a disk level not after a VM level" % where)
        if s["objectType"] == "host":
            check(not attrs, "%s: a host stat with attributes" % where)
    check(len({s["name"] for s in stats}) == 49, "expected 49 distinct names")

    table = run_ok(opts.tool, ["list"]).splitlines()
    check(len(table) == 71, "list prints %d lines, expected a header and 70 rows" % len(table))
    check(table and table[0].split()[:3] == ["id", "name", "object"], "list header %r" % (table[:1],))
    for s, line in zip(stats, table[1:]):
        words = line.split()
        check(words[:4] == [str(s["id"]), s["name"], s["objectType"], s["unit"]], "list row %r for stat %d" % (line, s["id"]))
        names = ", ".join(a["name"] for a in s["attributes"]) or "-"
        check(line.endswith(names), "list row %r does not end with the attributes %r" % (line, names))


# --- get-json -----------------------------------------------------------------------------------

def mode_get_json(opts, args):
    stats = load_list(opts.tool)
    requests = split_requests(args)
    out = run_ok(opts.tool, ["get", "--json"] + args, opts.host)
    answer = json.loads(out)["requests"]
    check(len(answer) == len(requests), "%d answers for %d requests" % (len(answer), len(requests)))
    table_rows = []
    for words, a in zip(requests, answer):
        s = stats[a["stat"]]
        where = "request %s" % " ".join(words)
        check(a["name"] == s["name"] and a["objectType"] == s["objectType"] and a["unit"] == s["unit"],
              "%s: stat fields %r" % (where, {k: a[k] for k in ("name", "objectType", "unit")}))
        names = [x["name"] for x in s["attributes"]]
        check(a["attributes"] == names, "%s: attributes %r, expected %r" % (where, a["attributes"], names))
        asked = words[1:] or ["*"] * len(names)
        check(a["instances"] == asked, "%s: instances %r" % (where, a["instances"]))
        check(len(a["values"]) > 0, "%s: no value" % where)
        seen = set()
        for v in a["values"]:
            inst = v["instances"]
            check(list(inst.keys()) == names, "%s: instance keys %r" % (where, list(inst.keys())))
            texts = [inst.get(n, "") for n in names]
            for n, text, pattern in zip(names, texts, asked):
                check(text != "*" and text != "", "%s: %s is %r in a result" % (where, n, text))
                check(pattern == "*" or pattern == text, "%s: %s is %r, asked %r" % (where, n, text, pattern))
            check(tuple(texts) not in seen, "%s: instance %r twice" % (where, texts))
            seen.add(tuple(texts))
            check(isinstance(v["value"], int), "%s: value %r is no integer" % (where, v["value"]))
            table_rows.append([str(a["stat"]), s["name"], s["objectType"]] + texts + [str(v["value"]), s["unit"]])

    # The table shows the same values in the same order, one block per request.
    table = run_ok(opts.tool, ["get"] + args, opts.host)
    rows = [line.split() for line in table.splitlines() if line and not line.startswith("id ")]
    check(rows == table_rows, "the table differs from the JSON output:\n%s" % table)


# --- prometheus ---------------------------------------------------------------------------------

SAMPLE = re.compile(r'^([a-zA-Z_:][a-zA-Z0-9_:]*)\{(.*)\} (\S+)$')
LABEL = re.compile(r'([a-zA-Z_][a-zA-Z0-9_]*)="((?:[^"\\]|\\.)*)"(,|$)')
FACTOR = {"percent": decimal.Decimal("0.01"), "kiloBytes": 1024, "megaBytes": 1048576, "megaHertz": 1000000,
          "number": 1, "microsecond": decimal.Decimal("0.000001"), "millisecond": decimal.Decimal("0.001"),
          "second": 1, "kiloBytesPerSecond": 1024, "megaBytesPerSecond": 1048576, "watt": 1, "joule": 1}
SUFFIX = {"percent": "_ratio", "kiloBytes": "_bytes", "megaBytes": "_bytes", "megaHertz": "_hertz", "number": "",
          "microsecond": "_seconds", "millisecond": "_seconds", "second": "_seconds",
          "kiloBytesPerSecond": "_bytes_per_second", "megaBytesPerSecond": "_bytes_per_second", "watt": "_watts",
          "joule": "_joules"}


def unescape(text):
    return re.sub(r'\\(.)', lambda m: "\n" if m.group(1) == "n" else m.group(1), text)


def parse_exposition(text, where):
    """Families in order: name -> {"help", "type", "samples": [(label values, value text)]}."""
    families, order, current = {}, [], None
    for line in text.splitlines():
        if line.startswith("# HELP ") or line.startswith("# TYPE "):
            kind, name = line[2:6], line.split(" ")[2]
            if name != current:
                check(name not in families, "%s: family %s is not contiguous" % (where, name))
                families[name] = {"help": None, "type": None, "samples": []}
                order.append(name)
                current = name
            key = "help" if kind == "HELP" else "type"
            check(families[name][key] is None, "%s: second %s line for %s" % (where, kind, name))
            families[name][key] = line.split(" ", 3)[3] if len(line.split(" ", 3)) > 3 else ""
            continue
        m = SAMPLE.match(line)
        if not check(m is not None, "%s: unparsable line %r" % (where, line)):
            continue
        name, labels, value = m.groups()
        check(name == current, "%s: sample of %s outside its family" % (where, name))
        values = [unescape(v) for _, v, _ in LABEL.findall(labels)]
        families.setdefault(name, {"help": None, "type": None, "samples": []})["samples"].append((values, value))
    for name in order:
        check(families[name]["type"] == "gauge", "%s: %s is not a gauge" % (where, name))
        check(families[name]["help"], "%s: %s has no HELP" % (where, name))
    return families


def promtool_clean(promtool, text, where):
    result = subprocess.run([promtool, "check", "metrics"], input=text.encode(), stdout=subprocess.PIPE,
                            stderr=subprocess.PIPE, timeout=120)
    said = (result.stdout + result.stderr).decode("utf-8", "replace").strip()
    check(result.returncode == 0 and said == "", "%s: promtool check metrics said (%d): %s" % (where, result.returncode, said))


def mode_prometheus(opts, args):
    if not check(opts.promtool and os.path.exists(opts.promtool), "promtool not found (Debian package prometheus)"):
        return
    stats = load_list(opts.tool)
    everything = run_ok(opts.tool, ["get", "--prometheus"] + args, opts.host)
    promtool_clean(opts.promtool, everything, "all requests")
    parse_exposition(everything, "all requests")
    for words in split_requests(args):
        where = " ".join(words)
        alone = run_ok(opts.tool, ["get", "--prometheus"] + words, opts.host)
        promtool_clean(opts.promtool, alone, where)
        families = parse_exposition(alone, where)
        answer = json.loads(run_ok(opts.tool, ["get", "--json"] + words, opts.host))["requests"][0]
        s = stats[answer["stat"]]
        if not check(len(families) == 1, "%s: %d families" % (where, len(families))):
            continue
        (name, family), = families.items()
        check(name.startswith("tarnstats_") and name.endswith(SUFFIX[s["unit"]]),
              "%s: metric %s for unit %s" % (where, name, s["unit"]))
        check(s["description"] in family["help"], "%s: HELP %r lacks the description" % (where, family["help"]))
        samples = {tuple(values): value for values, value in family["samples"]}
        check(len(samples) == len(answer["values"]), "%s: %d samples for %d values" % (where, len(samples), len(answer["values"])))
        for v in answer["values"]:
            key = tuple([s["objectType"]] + [v["instances"][a] for a in answer["attributes"]])
            if not check(key in samples, "%s: no sample for %r" % (where, key)):
                continue
            expected = decimal.Decimal(v["value"]) * decimal.Decimal(FACTOR[s["unit"]])
            check(decimal.Decimal(samples[key]) == expected,
                  "%s: %r is %s, expected %s (%d %s)" % (where, key, samples[key], expected, v["value"], s["unit"]))


# --- host-values --------------------------------------------------------------------------------

def expected_instances(stat, host):
    """The instance texts of a stat on a host file, in the file's order."""
    vms, kind = host.get("vms", []), stat["objectType"]
    names = lambda items: [i if isinstance(i, str) else i["name"] for i in items]
    if kind == "host":
        return [()]
    if kind == "VM":
        key = "worldGroupId" if stat["attributes"][0]["idMapType"] == "VM moid to world group id" else "worldId"
        return [(str(vm[key]),) for vm in vms]
    if kind == "vCpu":
        count = lambda vm: vm.get("vcpus", 1) if isinstance(vm.get("vcpus", 1), int) else len(vm["vcpus"])
        return [(str(vm["worldId"]), str(c)) for vm in vms for c in range(count(vm))]
    if kind == "vNic":
        port = lambda n: n if isinstance(n, int) else n["port"]
        return [(vm["moid"], str(port(n))) for vm in vms for n in vm.get("vnics", [])]
    if kind == "vDisk":
        return [(str(vm["worldGroupId"]), d["name"]) for vm in vms for d in vm.get("disks", [])]
    if kind == "vmLUN":
        return [(str(vm["worldId"]), lun) for vm in vms for lun in names(vm.get("luns", []))]
    member = {"hostLUN": "luns", "storageAdapter": "adapters", "storagePath": "paths", "pNic": "pnics"}[kind]
    return [(n,) for n in names(host.get(member, []))]


def given_values(host, stats):
    """(stat id, instance texts) -> value for every value the file gives."""
    by_type = {(s["name"], s["objectType"]): s for s in stats}
    out = {}

    def add(obj, kind, texts_of):
        for name, value in obj.get("values", {}).items():
            s = by_type[(name, kind)]
            out[(s["id"], texts_of(s))] = value

    add(host.get("host", {}), "host", lambda s: ())
    for member, kind in (("luns", "hostLUN"), ("adapters", "storageAdapter"), ("paths", "storagePath"), ("pnics", "pNic")):
        for item in host.get(member, []):
            if isinstance(item, dict):
                add(item, kind, lambda s, n=item["name"]: (n,))
    for vm in host.get("vms", []):
        world, group = str(vm["worldId"]), str(vm["worldGroupId"])
        add(vm, "VM", lambda s: (group,) if s["attributes"][0]["idMapType"] == "VM moid to world group id" else (world,))
        vcpus = vm.get("vcpus", 1)
        for c, cpu in enumerate(vcpus if isinstance(vcpus, list) else []):
            add(cpu, "vCpu", lambda s, c=c: (world, str(c)))
        for n in vm.get("vnics", []):
            if isinstance(n, dict):
                add(n, "vNic", lambda s, p=n["port"]: (vm["moid"], str(p)))
        for d in vm.get("disks", []):
            add(d, "vDisk", lambda s, d=d: (group, d["name"]))
        for lun in vm.get("luns", []):
            if isinstance(lun, dict):
                add(lun, "vmLUN", lambda s, n=lun["name"]: (world, n))
    return out


def mode_host_values(opts, _args):
    stats = load_list(opts.tool)
    with open(opts.host, encoding="utf-8") as f:
        host = json.load(f)
    args = []
    for s in stats:
        args += ["-r", str(s["id"])]
    # A stat without instances on this host yields no value: exit status 1 is then expected.
    expected = {s["id"]: expected_instances(s, host) for s in stats}
    status, out, err = run(opts.tool, ["get", "--json"] + args, opts.host)
    empty = [s["id"] for s in stats if not expected[s["id"]]]
    check(status == (1 if empty else 0), "exit status %d with %d empty stats: %s" % (status, len(empty), err))
    for line in err.splitlines():
        check(line.startswith("tarnstats: no value for "), "unexpected stderr line %r" % line)
    check(len(err.splitlines()) == len(empty), "%d no-value lines for %d empty stats" % (len(err.splitlines()), len(empty)))
    got = {}
    for a in json.loads(out)["requests"]:
        got[a["stat"]] = [(tuple(v["instances"][n] for n in a["attributes"]), v["value"]) for v in a["values"]]
    for s in stats:
        instances = [i for i, _ in got.get(s["id"], [])]
        check(instances == expected[s["id"]],
              "stat %d (%s@%s): instances %r, expected %r" % (s["id"], s["name"], s["objectType"], instances, expected[s["id"]]))
    given = given_values(host, stats)
    check(len(given) > 0, "the host file gives no value")
    for (stat, texts), value in given.items():
        values = dict(got.get(stat, []))
        check(values.get(texts) == value, "stat %d %r: %r, the file gives %r" % (stat, texts, values.get(texts), value))


# --- doc ----------------------------------------------------------------------------------------

def mode_doc(opts, _args):
    with open(opts.doc, encoding="utf-8") as f:
        text = f.read()
    with open(opts.json_doc or opts.doc, encoding="utf-8") as f:
        host = re.search(r"```json\n(.*?)```", f.read(), re.S)
    examples = 0
    with tempfile.TemporaryDirectory() as work:
        if host:
            with open(os.path.join(work, "host.json"), "w", encoding="utf-8") as f:
                f.write(host.group(1))
        for block in re.findall(r"```console\n(.*?)```", text, re.S):
            commands = re.split(r"^\$ ", block, flags=re.M)[1:]
            for command in commands:
                line, _, shown = command.partition("\n")
                words = shlex.split(line)
                if not check(words and words[0] == "tarnstats", "%s: not a tarnstats command: %r" % (opts.doc, line)):
                    continue
                expected, status = shown.splitlines(), 0
                if expected and re.fullmatch(r"\(exit status \d+\)", expected[-1]):
                    status = int(expected.pop()[13:-1])
                result = subprocess.run([os.path.abspath(opts.tool)] + words[1:], cwd=work, stdout=subprocess.PIPE,
                                        stderr=subprocess.PIPE, timeout=240)
                got = (result.stdout + result.stderr).decode("utf-8", "replace").splitlines()
                check(result.returncode == status, "%s: %r exited with %d, the text says %d" % (opts.doc, line, result.returncode, status))
                check(got == expected, "%s: %r prints\n%s\nthe text shows\n%s" % (opts.doc, line, "\n".join(got), "\n".join(expected)))
                examples += 1
    check(examples > 0, "%s has no example" % opts.doc)


def main():
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("--tool", required=True)
    parser.add_argument("mode", choices=["expect", "list-json", "get-json", "prometheus", "host-values", "doc"])
    parser.add_argument("--status", type=int, default=0)
    parser.add_argument("--golden")
    parser.add_argument("--stdout-line", action="append", default=[])
    parser.add_argument("--stdout-row", action="append", default=[])
    parser.add_argument("--stdout-empty", action="store_true")
    parser.add_argument("--stderr-line", action="append", default=[])
    parser.add_argument("--stderr-has", action="append", default=[])
    parser.add_argument("--stderr-empty", action="store_true")
    parser.add_argument("--stderr-prefix")
    parser.add_argument("--host")
    parser.add_argument("--promtool")
    parser.add_argument("--doc")
    parser.add_argument("--json-doc")
    argv = sys.argv[1:]
    args = argv[argv.index("--") + 1:] if "--" in argv else []
    opts = parser.parse_args(argv[:argv.index("--")] if "--" in argv else argv)
    {"expect": mode_expect, "list-json": mode_list_json, "get-json": mode_get_json, "prometheus": mode_prometheus,
     "host-values": mode_host_values, "doc": mode_doc}[opts.mode](opts, args)
    for f in FAILURES:
        print("FAIL: " + f)
    return 1 if FAILURES else 0


if __name__ == "__main__":
    sys.exit(main())
