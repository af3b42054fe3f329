#!/usr/bin/env python3
"""Writes schema/sysinfo.schema: the fixed rows of fixed_rows.py and, around them, placeholder
rows generated to the table rules (same counts, same tree and layout rules).

This is a one-off tool: its output is the committed definitions file, which gen_schema.py
checks and compiles. A host's own definitions replace that file directly. The output is
deterministic (fixed seed); run: python3 schema/tools/make_definitions.py > schema/sysinfo.schema
"""

import random
import re
import sys

sys.dont_write_bytecode = True
import fixed_rows as F  # noqa: E402
import vocab as V  # noqa: E402

SEED = 0x5e11f0
MAX_DEPTH = 7


def camel_words(name):
    return re.sub(r"(?<=[a-z0-9])(?=[A-Z])", " ", name).lower()


# ---------------------------------------------------------------------------------------------
# Types


class Type:
    def __init__(self, name, kind, size, text=None, elem=None, fields=None, elems=None,
                 flag_set=0, fixed=False, note=None):
        self.name, self.kind, self.size, self.text = name, kind, size, text
        self.elem = elem            # array: element Type
        self.fields = fields or []  # struct: (name, Type, offset, description)
        self.elems = elems or []    # enum: (name, value, text)
        self.flag_set, self.fixed, self.note = flag_set, fixed, note
        self.index = None

    def align(self):
        if self.kind == "scalar":
            return min(self.size, 4)
        if self.kind == "enum":
            return 4
        if self.kind == "array":
            return self.elem.align()
        return max([f[1].align() for f in self.fields] or [1])


def align_up(value, align):
    return (value + align - 1) // align * align


def lay_out(members):
    """32-bit x86 layout of (name, Type, description) members: 8-byte members on 4 bytes."""
    fields, offset, align = [], 0, 1
    for name, t, desc in members:
        a = t.align()
        offset = align_up(offset, a)
        fields.append((name, t, offset, desc))
        offset += t.size
        align = max(align, a)
    return fields, align_up(offset, align)


class TypeTable:
    def __init__(self):
        self.types = []
        self.by_name = {}

    def add(self, t):
        assert t.name not in self.by_name, t.name
        t.index = len(self.types)
        self.types.append(t)
        self.by_name[t.name] = t
        return t

    def __getitem__(self, name):
        return self.by_name[name]

    # Names that fixed or forced rows take later on.
    RESERVED = {"VSCSIKel_DevName", "NetKel_DummyString", "NetKel_DummyRecord", "ScsiKelHandleID"}

    def taken(self, name):
        return name in self.by_name or name in self.RESERVED


def struct(table, name, members, text, fixed=False):
    fields, size = lay_out(members)
    return table.add(Type(name, "struct", size, text=text, fields=fields, fixed=fixed))


class ModuleTypes:
    """The placeholder types of one module, generated to its budget of kinds."""

    def __init__(self, table, rng, key, prefix, eprefix, nouns, budget, enum_plan):
        self.table, self.rng, self.key = table, rng, key
        self.prefix, self.eprefix, self.nouns = prefix, eprefix, nouns.split()
        self.scalars, self.enums, self.flag_enums, self.arrays, self.structs = [], [], [], [], []
        self.strings = []
        self.pending = []  # arrays waiting to become a member of the next structure
        self.budget, self.enum_plan = budget, enum_plan

    def fresh(self, candidates):
        for name in candidates:
            if not self.table.taken(name):
                return name
        raise RuntimeError("no free name among %s..." % candidates[:3])

    def noun_order(self):
        nouns = self.nouns[:]
        self.rng.shuffle(nouns)
        return nouns

    def gen_enum(self):
        flag, unordered = self.enum_plan.pop(0)
        rng = self.rng
        if flag:
            suffix = "Flags"
        elif unordered:
            suffix = "Status"
        else:
            suffix = rng.choice([s for s in V.ENUM_SUFFIXES if s != "Status"] + ["Status"])
        name = self.fresh([self.prefix + n + suffix for n in self.noun_order()] +
                          [self.prefix + n + suffix + str(k) for k in range(2, 9)
                           for n in self.nouns])
        stem = name[len(self.prefix):].upper()
        if flag:
            words = rng.sample(V.FLAG_WORDS, rng.randint(3, 8))
            words.sort(key=V.FLAG_WORDS.index)
            values = [1 << i for i in range(len(words))]
            if rng.random() < 0.5:
                words, values = ["NONE"] + words, [0] + values
        elif unordered:
            pool = V.ENUM_SUFFIXES["Status"].split()
            words = pool[:rng.randint(4, len(pool))]
            values = [0] + [-i for i in range(1, len(words))]
        else:
            pool = V.ENUM_SUFFIXES[suffix].split()
            k = rng.randint(2, len(pool))
            words = sorted(rng.sample(pool, k), key=pool.index)
            values = list(range(k))
            if suffix in ("State", "Type") and rng.random() < 0.25:
                words, values = ["INVALID"] + words, [-1] + values
        elems = [("%s_%s_%s" % (self.eprefix, stem, w), v, w.lower().replace("_", " "))
                 for w, v in zip(words, values)]
        text = "" if rng.random() < 0.1 else camel_words(name[len(self.prefix):])
        t = self.table.add(Type(name, "enum", 4, text=text, elems=elems, flag_set=int(flag)))
        (self.flag_enums if flag else self.enums).append(t)

    def gen_scalar(self, forced=None):
        if forced:
            t = self.table.add(forced)
        else:
            options = [(n, s) for n in self.noun_order() for s in V.SCALAR_SUFFIXES]
            noun, (suffix, size, fmt) = next(
                (n, s) for n, s in options if not self.table.taken(self.prefix + n + s[0]))
            t = self.table.add(Type(self.prefix + noun + suffix, "scalar", size, text=fmt))
        self.scalars.append(t)

    def gen_array(self, forced=None):
        rng, T = self.rng, self.table
        if forced:
            t = T.add(forced)
        else:
            roll = rng.random()
            if not self.strings or (roll < 0.35 and not self.structs):
                kind = "string"
            elif roll < 0.35:
                kind = "structs"
            elif roll < 0.65:
                kind = "string"
            else:
                kind = "list"
            nouns = self.noun_order()
            if kind == "string":
                suffixes = ["Name", "String", "Path", "Label", "Text", "Desc"]
                name = self.fresh([self.prefix + n + s for s in suffixes for n in nouns])
                t = T.add(Type(name, "array", rng.choice([16, 32, 64, 128, 256]),
                               elem=T["KEL_STRING"]))
                self.strings.append(t)
            elif kind == "structs":
                elem = rng.choice(self.structs[-12:])
                count = rng.choice([c for c in (2, 4, 8, 16, 32) if c * elem.size <= 65536] or [2])
                name = self.fresh([elem.name + s for s in ("Array", "Table", "List")] +
                                  [self.prefix + n + "Array" for n in nouns])
                t = T.add(Type(name, "array", count * elem.size, elem=elem))
            else:
                elem = rng.choice([T["KEL_DEC_U32"], T["KEL_DEC_U64"], T["KEL_HEX_U8"],
                                   T["KEL_DEC_U16"]] + self.scalars[-3:])
                count = rng.choice([2, 4, 6, 8, 16, 32, 64])
                suffixes = ["List", "Vector", "Set", "Map", "Histo"]
                name = self.fresh([self.prefix + n + s for s in suffixes for n in nouns])
                t = T.add(Type(name, "array", count * elem.size, elem=elem))
        self.arrays.append(t)
        if t.size and t.size <= 4096:
            self.pending.append(t)
        return t

    def member_type(self, member):
        rng, T = self.rng, self.table
        pick = lambda pool, default: rng.choice(pool) if pool else T[default]  # noqa: E731
        if member in ("id", "parentId", "index", "owner"):
            ids = [s for s in self.scalars if s.name.endswith(("ID", "Index", "Handle"))]
            return pick(ids, "KEL_DEC_U32")
        if member == "name":
            return pick(self.strings, "KEL_DEC_U32")
        if member in ("type", "state", "mode", "policy"):
            return pick(self.enums, "KEL_DEC_U32")
        if member == "flags":
            return pick(self.flag_enums, "KEL_HEX_U32")
        if member == "enabled":
            return T["KEL_BOOL"]
        if member == "priority":
            return T["KEL_DEC_U8"]
        if member == "weight":
            return T["KEL_DEC_U16"]
        if member == "address":
            return rng.choice([T["KEL_HEX_U64"], T["KEL_VA"]])
        if member in ("capacity", "used", "free"):
            return rng.choice([T["KEL_DEC_U64"], T["KEL_KILOBYTE"], T["KEL_MEGABYTE"]])
        if member in ("timeout", "interval", "period"):
            ms = [s for s in self.scalars if s.name.endswith(("Msec", "Usec"))]
            return pick(ms, "KEL_DEC_U32")
        roll = rng.random()
        if roll < 0.6:
            return T["KEL_DEC_U64"]
        counts = [s for s in self.scalars if s.name.endswith(("Count", "Bytes", "Usec", "Cycles",
                                                                "Seq", "Pages", "Msec"))]
        if roll < 0.85 or not counts:
            return T["KEL_DEC_U32"]
        return rng.choice(counts)

    def gen_struct(self, forced=None):
        """A structure; `forced` gives its (name, members, text) instead."""
        rng = self.rng
        if forced:
            name, members, text = forced
            t = struct(self.table, name, members, text)
            self.structs.append(t)
            return t
        suffix = rng.choice(V.STRUCT_SUFFIXES)
        name = self.fresh([self.prefix + n + suffix for n in self.noun_order()] +
                          [self.prefix + n + s for s in V.STRUCT_SUFFIXES for n in self.nouns])
        suffix = next(s for s in V.STRUCT_SUFFIXES if name.endswith(s))
        if suffix in V.COUNTER_SUFFIXES:
            words, k = V.COUNTER_MEMBERS, rng.randint(3, 10)
        elif suffix in V.CONFIG_SUFFIXES:
            words, k = V.CONFIG_MEMBERS, rng.randint(2, 7)
        else:
            words, k = V.INFO_MEMBERS, rng.randint(3, 8)
        chosen = sorted(rng.sample(words, k), key=words.index)
        members = []
        for m in chosen:
            members.append((m, self.member_type(m), self.describe(m)))
        for arr in self.pending:
            label = arr.name[len(self.prefix):]
            label = label[0].lower() + label[1:]
            members.append((label, arr, self.describe(label)))
        self.pending = []
        if self.structs and rng.random() < 0.15:
            inner = rng.choice(self.structs[-8:])
            label = inner.name[len(self.prefix):]
            members.insert(rng.randrange(len(members) + 1),
                           (label[0].lower() + label[1:], inner, "embedded"))
        text = "" if rng.random() < 0.1 else camel_words(name[len(self.prefix):])
        t = struct(self.table, name, members, text)
        self.structs.append(t)
        return t

    def describe(self, member):
        if self.rng.random() < 0.7:
            return member
        return V.DESCRIPTIONS.get(member, camel_words(member))

    def generate(self, forced=None, insert_at=None, insert=None):
        """Generates the module's types to its budget. `forced` may hold "scalars" (prebuilt
        scalars used first) and "array" (position among the arrays, prebuilt array, and a
        function giving the (name, members, text) of the structure that follows it); `insert`
        is a prebuilt type placed after `insert_at` generated ones."""
        forced = forced or {}
        scalars, enums, arrays, structs = self.budget
        rest = arrays + structs
        plan = ["e"] * enums + ["c"] * scalars + [
            "a" if ((i + 1) * arrays) // rest > (i * arrays) // rest else "s"
            for i in range(rest)]
        forced_scalars = list(forced.get("scalars", []))
        forced_array = forced.get("array")
        next_struct = None
        for done, slot in enumerate(plan):
            if insert is not None and done == insert_at:
                self.table.add(insert)
            if slot == "e":
                self.gen_enum()
            elif slot == "c":
                self.gen_scalar(forced_scalars.pop(0) if forced_scalars else None)
            elif slot == "a":
                if forced_array and forced_array[0] == len(self.arrays):
                    arr = self.gen_array(forced_array[1])
                    next_struct = forced_array[2](arr)
                    forced_array = None
                else:
                    self.gen_array()
            else:
                self.gen_struct(next_struct)
                next_struct = None
        assert forced_array is None and next_struct is None and not forced_scalars
        assert len(self.scalars) == scalars and len(self.enums) + len(self.flag_enums) == enums
        assert len(self.arrays) == arrays and len(self.structs) == structs, (self.key,)

    def pools(self):
        return dict(s=self.structs, e=self.enums, fe=self.flag_enums, sc=self.scalars,
                    arr=[a for a in self.arrays if a.size], str=self.strings)


def enum_plan(total, flag_sets, unordered):
    """Spreads the flag-set and out-of-order enumerations over the placeholder ones."""
    flags = {(i * total) // flag_sets + 1 for i in range(flag_sets)}
    others = [i for i in range(total) if i not in flags]
    disorder = {others[(i * len(others)) // unordered + 5] for i in range(unordered)}
    return [(i in flags, i in disorder) for i in range(total)]


def build_types(rng):
    table = TypeTable()
    for name, kind, size, text in F.BASIC_TYPES:
        elems = F.KEL_TIME_UNIT_ELEMENTS if name == "KEL_TIME_UNIT" else None
        table.add(Type(name, kind, size, text=text, elems=elems, fixed=True))
    table.add(Type("KELCompatHashArray", "array", 2048 * 8, elem=table["KEL_DEC_U64"], fixed=True))
    t = table.add(Type("KELCompatData", "struct", 16388, text="kel version compatibility data",
                       fields=[("hashes", table["KELCompatHashArray"], 0, "node hashes"),
                               ("numNodes", table["KEL_DEC_U32"], 16384, "num nodes")],
                       fixed=True))
    assert lay_out([(f[0], f[1], f[3]) for f in t.fields])[1] == t.size

    # Generic histogram and address types.
    bucket = struct(table, "KEL_HistogramGenericBucket",
                    [("limit", table["KEL_DEC_S64"], "bucket upper limit"),
                     ("count", table["KEL_DEC_U64"], "count")], "histogram bucket")
    buckets = table.add(Type("KEL_HistogramGenericBucketArray", "array", 0, elem=bucket,
                             note="name and open length fixed"))
    struct(table, "KEL_HistogramGeneric",
           [("numBuckets", table["KEL_DEC_U32"], "number of buckets"),
            ("minValue", table["KEL_DEC_S64"], "min value"),
            ("maxValue", table["KEL_DEC_S64"], "max value"),
            ("sum", table["KEL_DEC_S64"], "sum"),
            ("count", table["KEL_DEC_U64"], "count"),
            ("buckets", buckets, "buckets")], "generic histogram")
    table.add(Type("KEL_IPv4Address", "array", 4, elem=table["KEL_DEC_U8"]))
    table.add(Type("KEL_IPv6Address", "array", 16, elem=table["KEL_HEX_U8"]))
    table.add(Type("KEL_Uuid", "array", 16, elem=table["KEL_HEX_U8"]))

    budgets = [m[4] for m in V.TYPE_MODULES]
    plan = enum_plan(sum(b[1] for b in budgets), 29, 4)
    modules = {}
    stat = F.stat_types()
    for key, prefix, eprefix, nouns, budget in V.TYPE_MODULES:
        if key == "tpm":
            add_stat_types(table, stat)
        mod = ModuleTypes(table, rng, key, prefix, eprefix, nouns, budget, plan)
        forced, insert_at, insert = {}, None, None
        if key == "net":
            dummy = Type("NetKel_DummyString", "array", 0, elem=table["KEL_STRING"],
                         note="name and open length fixed")
            forced["array"] = (9, dummy, lambda arr: (
                "NetKel_DummyRecord",
                [("length", table["KEL_DEC_U32"], "length"), ("data", arr, "data")],
                "dummy record"))
        if key == "scsi":
            forced["scalars"] = [Type("ScsiKelHandleID", "scalar", 8, text="%Lu ",
                                note="name, size and format fixed")]
        if key == "vscsi":
            insert = Type("VSCSIKel_DevName", "array", 16, elem=table["KEL_STRING"], fixed=True)
            insert_at = F.VSCSI_DEVNAME_INDEX - len(table.types)
        mod.generate(forced, insert_at, insert)
        modules[key] = mod
    assert table["VSCSIKel_DevName"].index == F.VSCSI_DEVNAME_INDEX
    assert len(table.types) == 1061, len(table.types)
    return table, modules


def add_stat_types(table, stat):
    assert len(table.types) == 984, len(table.types)
    for index in range(984, 1048):
        d = stat[index]
        if d["kind"] == "enum":
            t = Type(d["name"], "enum", 4, text=d["text"], elems=d["elems"], fixed=True)
        elif d["kind"] == "array":
            t = Type(d["name"], "array", d["size"], elem=table[d["elem"]], fixed=True)
        else:
            fields = [(n, table[tn], off, desc) for n, tn, off, desc in d["fields"]]
            t = Type(d["name"], "struct", d["size"], text=d["text"], fields=fields, fixed=True)
            members = [(n, ty, desc) for n, ty, _, desc in fields]
            assert lay_out(members) == (fields, d["size"]), d["name"]
        table.add(t)


# ---------------------------------------------------------------------------------------------
# Nodes


class Node:
    def __init__(self, leaf, module, parent=None, block=None):
        self.leaf, self.module, self.parent, self.block = leaf, module, parent, block
        self.children = []
        self.name = self.id = None
        self.inst = None  # "int" or "str" on instance nodes
        self.flag4 = self.flag5 = self.flag7 = self.has_input = self.untyped = 0
        self.out = self.inp = self.out2 = None
        self.stat_link = -1
        self.locked = False
        self.empty = False
        self.depth = parent.depth + 1 if parent else 0
        if parent:
            parent.children.append(self)

    def path(self):
        parts, n = [], self
        while n is not None:
            parts.append(n.name)
            n = n.parent
        return "/".join(reversed(parts))


INF = 10 ** 9


def min_desc(branches, levels):
    """Fewest descendants of a branch that holds `branches` non-empty sub-branches."""
    if branches == 0:
        return 1
    if levels < 2:
        return INF
    return branches + -(-branches // (levels - 1))


def fill(rng, node, count, branches, levels, deep=False):
    """Adds `count` descendants below `node`, `branches` of them non-empty branches, none more
    than `levels` below it; with `deep`, one of them lies exactly `levels` below."""
    if count == 0 and branches == 0:
        return
    assert count >= min_desc(branches, levels), (count, branches, levels)
    assert not deep or branches >= levels - 1
    if branches == 0:
        for _ in range(count):
            Node(True, node.module, node, node.block)
        return
    for _ in range(500):
        if levels == 2:
            k = branches
        else:
            kmax = min(branches, 7)
            if deep:
                kmax = min(kmax, branches - (levels - 2))
            k = rng.randint(1, kmax)
        sub = [0] * k
        if deep and levels > 2:
            sub[0] = levels - 2
        for _ in range(branches - k - sum(sub)):
            sub[rng.randrange(k)] += 1
        mins = [min_desc(b, levels - 1) for b in sub]
        extra = count - k - sum(mins)
        if extra < 0:
            continue
        leaves = int(extra * rng.uniform(0.2, 0.55))
        sizes = mins[:]
        for _ in range(extra - leaves):
            weights = [b + 1 for b in sub]
            sizes[rng.choices(range(k), weights)[0]] += 1
        order = ["leaf"] * leaves + list(range(k))
        rng.shuffle(order)
        for item in order:
            if item == "leaf":
                Node(True, node.module, node, node.block)
            else:
                child = Node(False, node.module, node, node.block)
                fill(rng, child, sizes[item], sub[item], levels - 1, deep and item == 0)
        return
    raise RuntimeError("cannot place %d nodes with %d branches in %d levels"
                       % (count, branches, levels))


# Contiguous subtrees: top id -> (internal branches, empty branches, reach the deepest level).
CONTIGUOUS = {
    "net": (82, 1, True), "vm": (1, 0, False), "world": (5, 0, False), "config": (0, 0, False),
    "sched": (46, 1, False), "userworld": (46, 1, False), "tarnModules": (0, 0, False),
    "timer": (0, 0, False), "power": (3, 0, False), "worldlets": (3, 0, False),
    "tarnAccess": (3, 0, False), "killswitches": (0, 0, False), "tpm": (0, 0, False),
}

# Spread subtrees: blocks (first id, attached to "top" or to the block with that first id,
# size, branches, empty branches). The block at the top's own id holds the top; its branches
# do not count the top.
SPREAD_BLOCKS = {
    "memory": [(412, "top", 41, 8, 0), (1517, "top", 1, 0, 0)],
    "worldGroups": [(492, "top", 26, 5, 0), (1700, "top", 6, 1, 0)],
    "reliability": [(521, "top", 80, 15, 0), (1515, "top", 2, 1, 0)],
    "hardware": [(601, "top", 51, 10, 1), (1465, "top", 10, 2, 0), (1492, "top", 5, 1, 0)],
    "system": [(1123, "top", 5, 0, 0), (1114, "top", 2, 1, 0), (1116, "top", 2, 1, 0),
               (1118, "top", 2, 1, 0), (1120, "top", 1, 0, 0), (1121, "top", 1, 0, 0),
               (1122, "top", 1, 0, 0), (1129, "top", 40, 8, 1), (1169, "top", 35, 7, 0),
               (1204, "top", 30, 6, 0), (1234, "top", 28, 5, 0), (1262, "top", 25, 5, 0),
               (1287, "top", 26, 4, 0)],
    "storage": [(1313, "top", 1, 0, 0), (1397, "top", 15, 3, 0), (1412, "top", 12, 2, 0),
                (1424, "top", 10, 2, 0), (1434, "top", 8, 2, 0), (1320, 1397, 9, 2, 0),
                (1329, 1412, 6, 1, 0), (1335, 1424, 4, 1, 0), (1339, 1434, 3, 1, 0),
                (1342, 1397, 3, 1, 0), (1520, "top", 14, 2, 0), (1534, "top", 12, 2, 0),
                (1546, "top", 12, 1, 0), (1459, 1520, 4, 1, 0), (1463, 1534, 2, 1, 0)],
    "perf": [(1372, "top", 25, 3, 0), (1349, "top", 8, 2, 0), (1357, "top", 5, 1, 0),
             (1362, "top", 4, 1, 0), (1366, "top", 3, 1, 0), (1369, "top", 2, 1, 0),
             (1371, "top", 1, 0, 0), (1497, "top", 1, 0, 0)],
}


def make_empty(rng, block_nodes, count):
    leaves = [n for n in block_nodes if n.leaf and not n.locked and n.depth >= 2]
    for n in rng.sample(leaves, count):
        n.leaf, n.empty = False, True


def block_nodes(root):
    out, stack = [], [root]
    while stack:
        n = stack.pop()
        out.append(n)
        stack.extend(reversed([c for c in n.children if c.block is root.block]))
    return out


def build_tree(rng):
    root = Node(False, None)
    root.name, root.id, root.locked = "root", 0, True
    tops = {}
    for tid, name, size in F.ROOT_CHILDREN:
        leaf = name in ("sysInfoNodeHashes", "rpcStats")
        top = Node(leaf, name, root, block=("block", tid))
        top.name, top.id, top.locked = name, tid, True
        tops[name] = top
    tops["worldGroups"].inst = "int"
    tops["tarnModules"].empty = True
    for name, (branches, empties, deep) in CONTIGUOUS.items():
        top = tops[name]
        size = dict((n, s) for _, n, s in F.ROOT_CHILDREN)[name]
        fill(rng, top, size - 1, branches - empties, MAX_DEPTH - top.depth, deep)
        make_empty(rng, block_nodes(top), empties)
        assert len(block_nodes(top)) == size
    block_roots = []
    for name, blocks in SPREAD_BLOCKS.items():
        top = tops[name]
        roots = {}
        for first, attach, size, branches, empties in blocks:
            if first == top.id:
                broot = top
                fill(rng, top, size - 1, branches - empties, MAX_DEPTH - top.depth)
            else:
                parent = top if attach == "top" else roots[attach]
                assert not parent.leaf
                broot = Node(branches == 0, name, parent, block=("block", first))
                if branches:
                    fill(rng, broot, size - 1, branches - 1 - empties,
                         MAX_DEPTH - broot.depth)
                else:
                    assert size == 1
            make_empty(rng, block_nodes(broot), empties)
            roots[first] = broot
            block_roots.append((broot, first))
        if name == "worldGroups":
            add_vscsi(top)
    add_stat_subtree(tops["statsRegistry"])
    return root, tops, block_roots


def add_vscsi(group):
    vscsi = Node(False, "worldGroups", group, block=("block", 1314))
    vscsi.name, vscsi.id, vscsi.inst, vscsi.locked = "vscsi", 1314, "int", True
    for nid, name, parent in F.VSCSI_ROWS[1:]:
        leaf = Node(True, "worldGroups", vscsi, block=("block", 1314))
        leaf.name, leaf.id, leaf.locked = name, nid, True


def add_stat_subtree(top):
    """The stat subtree with its fixed ids."""
    cats = {}
    for cid, name in F.STAT_CATEGORIES:
        c = Node(False, "statsRegistry", top, block=top.block)
        c.name, c.id, c.locked = name, cid, True
        cats[cid] = c
    cats[1611].empty = True
    for cat, set_branch, levels, read_id, read_name, first_stat, count in F.STAT_READS:
        parent = cats[cat]
        if set_branch:
            sb = Node(False, "statsRegistry", parent, block=top.block)
            sb.name, sb.id, sb.locked = set_branch[1], set_branch[0], True
            cur = sb
            for k, (lid, key) in enumerate(levels):
                last = k == len(levels) - 1
                lvl = Node(last, "statsRegistry", cur, block=top.block)
                lvl.name, lvl.id, lvl.inst, lvl.locked = "arg%d" % (k + 1), lid, key, True
                cur = lvl
            read = cur
        else:
            read = Node(True, "statsRegistry", parent, block=top.block)
            read.name, read.id, read.locked = read_name, read_id, True
            read.out2 = "KEL_Empty_Output"
        assert read.id == read_id
        read.out = "StatsRegistry_GetStruct%d" % count
        read.stat_link = read_id + count
        for k in range(count):
            stat = first_stat + k
            leaf = Node(True, "statsRegistry", parent, block=top.block)
            leaf.name = F.METADATA_NAMES[stat] + ".metadata"
            leaf.id, leaf.locked, leaf.stat_link = read_id + 1 + k, True, stat
            leaf.out = "StatsRegistry_Metadata"


def all_nodes(root):
    out, stack = [], [root]
    while stack:
        n = stack.pop()
        out.append(n)
        stack.extend(n.children)
    return out


def assign_ids(root, tops, block_roots):
    """Numbers every placeholder node: each block in preorder from its first id."""
    for name in CONTIGUOUS:
        number_block_placed(tops[name])
    for broot, first in block_roots:
        number_block_placed(broot, first)
    nodes = all_nodes(root)
    ids = sorted(n.id for n in nodes)
    assert ids == list(range(len(nodes))), [i for i in range(len(nodes)) if i not in ids][:10]
    return sorted(nodes, key=lambda n: n.id)


def number_block_placed(root, first=None):
    first = root.id if first is None else first
    for k, n in enumerate(block_nodes(root)):
        if n.locked:
            assert n.id == first + k, (n.path(), n.id, first + k)
        else:
            n.id = first + k


# ---------------------------------------------------------------------------------------------
# Attributes, names and record types of the placeholder nodes


def assign_attributes(rng, nodes):
    free = [n for n in nodes if not n.locked]
    branches = [n for n in free if not n.leaf and not n.empty]
    leaves = [n for n in free if n.leaf]
    fixed_inst = sum(1 for n in nodes if n.locked and n.inst)
    fixed_int = sum(1 for n in nodes if n.locked and n.inst == "int")
    inst_branches = rng.sample(branches, 180)
    inst_leaves = rng.sample(leaves, 310 - fixed_inst - 180)
    inst = inst_branches + inst_leaves
    ints = set(id(n) for n in rng.sample(inst, 191 - fixed_int))
    for n in inst:
        n.inst = "int" if id(n) in ints else "str"
    flagged = rng.sample(inst_branches, 3)
    flagged[0].flag4 = 1
    flagged[1].flag5 = flagged[2].flag5 = 1
    plain_branches = [n for n in free if not n.leaf and not n.inst]
    for n in rng.sample(plain_branches, 7):
        n.flag7 = 1
    plain_leaves = [n for n in leaves if not n.inst]
    for n in rng.sample(leaves, 163):
        n.flag7 = 1
    special = rng.sample(plain_leaves, 8)
    for n in special[:5]:
        n.has_input = 1
    for n in special[5:]:
        n.untyped = 1


GENERIC_GROUPS = "info stats config state control debug params".split()
GENERIC_INT = "ids entries slots indexes instances".split()
GENERIC_STR = "names keys labels".split()


def leaf_words(module):
    words = (V.NODE_MODULES[module][4] + " " + V.GENERIC_LEAVES).split()
    return [w.split(":") for w in words]


def assign_names(rng, nodes):
    for parent in nodes:
        used = {c.name for c in parent.children if c.name}
        for c in parent.children:
            if c.name:
                continue
            mod = V.NODE_MODULES[c.module]
            if c.inst:
                pool = (mod[2] if c.inst == "int" else mod[3]).split() or \
                       (GENERIC_INT if c.inst == "int" else GENERIC_STR)
            elif not c.leaf:
                pool = mod[1].split() or GENERIC_GROUPS
            else:
                pool = [w for w, _ in leaf_words(c.module)]
            pool = pool[:]
            rng.shuffle(pool)
            name = next((p for p in pool if p not in used), None)
            k = 2
            while name is None:
                name = next((p + str(k) for p in pool if p + str(k) not in used), None)
                k += 1
            c.name = name
            used.add(name)


class TypePicker:
    def __init__(self, rng, table, modules):
        self.rng, self.table, self.modules = rng, table, modules
        self.cursor = {}

    def pool(self, module, cls):
        keys = V.NODE_MODULES[module][0]
        out = []
        for k in keys:
            out += self.modules[k].pools()[cls]
        return out

    def next(self, module, cls):
        basic = {"u32": "KEL_DEC_U32", "u64": "KEL_DEC_U64", "bool": "KEL_BOOL",
                 "hist": "KEL_HistogramGeneric"}
        if cls in basic:
            return basic[cls]
        pool = self.pool(module, cls) or self.pool(module, "s")
        k = self.cursor.get((module, cls), 0)
        self.cursor[(module, cls)] = k + 1
        return pool[k % len(pool)].name


def assign_types(rng, nodes, table, modules):
    picker = TypePicker(rng, table, modules)
    classes = {}
    for module in V.NODE_MODULES:
        classes[module] = dict((w, c) for w, c in leaf_words(module))
    commands = []
    for n in nodes:
        if not n.leaf or n.locked or n.untyped:
            continue
        base = re.sub(r"\d+$", "", n.name)
        cls = classes[n.module].get(base, "s") if not n.inst else "s"
        n.out = picker.next(n.module, cls)
        n.out2 = "KEL_Empty_Output"
        if n.has_input:
            n.inp = picker.next(n.module, "s")
            commands.append(n)
    extra = [n for n in nodes if n.leaf and not n.locked and not n.untyped and not n.has_input]
    commands += rng.sample(extra, 6)
    for n in commands:
        n.out2 = picker.next(n.module, "s")
    # Fixed rows whose records are not given.
    by_id = {n.id: n for n in nodes}
    by_id[1].out, by_id[1].out2 = "KELCompatData", "KEL_Empty_Output"
    by_id[453].out, by_id[453].out2 = modules["rpc"].structs[0].name, "KEL_Empty_Output"
    vstats = next(s for s in modules["vscsi"].structs if s.name.endswith("Stats"))
    for nid, out in ((1315, "VSCSIKel_DevName"), (1316, vstats.name), (1317, "KEL_DEC_U32"),
                     (1318, "KEL_DEC_U64"), (1319, "KEL_DEC_U64")):
        by_id[nid].out, by_id[nid].out2 = out, "KEL_Empty_Output"


def fnv1a64(text):
    h = 0xcbf29ce484222325
    for b in text.encode():
        h = ((h ^ b) * 0x100000001b3) & 0xFFFFFFFFFFFFFFFF
    return h


# ---------------------------------------------------------------------------------------------
# Output

HEADER = """\
# Sysinfo definitions: every record type and every node of the kernel's sysinfo tree.
# schema/gen_schema.py checks these rows against the table rules and generates the exported
# tables from them (kelTypeDefsLookupTab, kelNodesLookupTab and the member and element tables).
#
# Format: one row per line; blank lines and lines starting with '#' are ignored. Fields are
# separated by blanks; texts stand in double quotes (\\" and \\\\ inside). '-' is "none".
#
#   iface_hash 0xHASH                     the hash of the whole set of nodes and types
#   expect METRIC VALUE                   a count the tables must have (see schemagen/rules.py)
#   type INDEX NAME scalar SIZE "FORMAT"
#   type INDEX NAME array SIZE ELEMENT_TYPE            (SIZE 0: open length)
#   type INDEX NAME struct SIZE COUNT "DESCRIPTION"    followed by COUNT field rows
#   type INDEX NAME enum SIZE COUNT FLAGSET "DESCRIPTION"  followed by COUNT elem rows
#     field NAME TYPE OFFSET "DESCRIPTION"   a member; offsets as on 32-bit x86
#     elem NAME VALUE "TEXT"                 an element, in definition order
#   node ID NAME PARENT SIBLING CHILD FLAGS OUT OUTSIZE IN INSIZE OUT2 OUT2SIZE STATLINK HASH
#
# Types are named by NAME wherever rows refer to them. FLAGS has 8 characters, each its letter
# or '-': L isLeaf, I hasInput, U isUntypedLeaf, X isInstance, 4 flag4, 5 flag5,
# N isIntegerInstance, 7 flag7. OUT, IN and OUT2 are the output, input and second output
# types, each followed by its size in bytes (0 with '-').
#
# Rows under a "# fixed rows" comment are those the library and its users rely on: the basic
# types, the stat types, VSCSIKel_DevName, the root and its children, the virtual SCSI rows and
# the whole statsRegistry subtree. In those node rows the id, name, links and flags are fixed,
# and so are the record types of nodes 1, 1315 and the statsRegistry subtree; the other record
# types there are placeholders. Rows under a "# placeholder rows" comment are not used by the
# library: they were generated to the table rules (same counts, links, layouts and sizes) by
# schema/tools/make_definitions.py. Node hashes are placeholders in every row (64-bit FNV-1a
# of the node's path). A host's own definitions replace this file as a whole.
"""


def q(text):
    return '"%s"' % text.replace("\\", "\\\\").replace('"', '\\"')


def write_types(out, table):
    status = None
    for t in table.types:
        s = "fixed" if t.fixed else "placeholder"
        if s != status:
            out.append("")
            out.append("# %s rows" % s)
            status = s
        if t.note:
            out.append("# %s: %s" % (t.name, t.note))
        if t.kind == "scalar":
            out.append("type %d %s scalar %d %s" % (t.index, t.name, t.size, q(t.text)))
        elif t.kind == "array":
            out.append("type %d %s array %d %s" % (t.index, t.name, t.size, t.elem.name))
        elif t.kind == "struct":
            out.append("type %d %s struct %d %d %s" % (t.index, t.name, t.size, len(t.fields),
                                                       q(t.text)))
            for name, ft, offset, desc in t.fields:
                out.append("    field %s %s %d %s" % (name, ft.name, offset, q(desc)))
        else:
            out.append("type %d %s enum 4 %d %d %s" % (t.index, t.name, len(t.elems), t.flag_set,
                                                       q(t.text)))
            for name, value, text in t.elems:
                out.append("    elem %s %d %s" % (name, value, q(text)))


def flags_of(n):
    bits = [n.leaf, n.has_input, n.untyped, bool(n.inst), n.flag4, n.flag5, n.inst == "int",
            n.flag7]
    return "".join(c if b else "-" for c, b in zip("LIUX45N7", bits))


def write_nodes(out, nodes, table):
    fixed_ids = {0} | {i for i, _, _ in F.ROOT_CHILDREN} | set(range(1314, 1320)) | \
        set(range(1558, 1700))
    status = None
    size = lambda name: table[name].size if name else 0  # noqa: E731
    for n in nodes:
        s = "fixed" if n.id in fixed_ids else "placeholder"
        if s != status:
            out.append("")
            out.append("# %s rows" % s)
            status = s
        kids = sorted((c.id for c in n.children), reverse=True)
        parent = n.parent.id if n.parent else 0
        siblings = sorted((c.id for c in n.parent.children), reverse=True) if n.parent else [0]
        pos = siblings.index(n.id)
        sibling = siblings[pos + 1] if n.parent and pos + 1 < len(siblings) else -1
        out.append("node %d %s %d %d %d %s %s %d %s %d %s %d %d 0x%016x" % (
            n.id, n.name, parent, sibling, kids[0] if kids else -1, flags_of(n),
            n.out or "-", size(n.out), n.inp or "-", size(n.inp), n.out2 or "-", size(n.out2),
            n.stat_link, fnv1a64(n.path())))


def check_ranges(tops):
    for tid, name, size in F.ROOT_CHILDREN:
        ids = sorted(n.id for n in all_nodes(tops[name]))
        assert len(ids) == size, (name, len(ids), size)
        contiguous = ids == list(range(ids[0], ids[0] + size))
        assert contiguous == (name not in F.SPREAD), name


def main():
    rng = random.Random(SEED)
    table, modules = build_types(rng)
    root, tops, block_roots = build_tree(rng)
    nodes = assign_ids(root, tops, block_roots)
    check_ranges(tops)
    assign_attributes(rng, nodes)
    assign_names(rng, nodes)
    assign_types(rng, nodes, table, modules)
    out = [HEADER.rstrip("\n"), "", "iface_hash 0x%016x" % F.IFACE_HASH, ""]
    out += ["expect %s %d" % (m, v) for m, v in F.EXPECT]
    write_types(out, table)
    write_nodes(out, nodes, table)
    sys.stdout.write("\n".join(out) + "\n")


if __name__ == "__main__":
    main()
