"""The rules that bind the rows of the sysinfo definitions to one another.

check(schema) returns a list of SchemaError, each naming the offending row. The rules:
- types: indexes in file order; unique C names; scalar sizes 1, 2, 4 or 8 with a format;
  arrays a whole multiple of their element's size (0 for open length); structures with exactly
  their declared members, in ascending offset, not overlapping, within the size, aligned as on
  32-bit x86 (8-byte members on 4 bytes); enumerations of 4 bytes with exactly their declared
  elements, element names unique, flag-set values single bits;
- nodes: ids in file order; node 0 is "root"; parents are branches; each child chain starts at
  the parent's child, strictly descends in id through sibling and holds exactly the nodes of
  that parent; names unique among siblings; no cycles; flags consistent with the node's kind;
  record sizes equal their types' sizes; hashes unique;
- the stat subtree under the root's "statsRegistry": categories, set branches, argK instance
  chains, read nodes returning StatsRegistry_GetStructN and the N .metadata leaves after them;
- the counts named by the file's expect rows (see metrics()).
"""

import re

from .model import IDENT, SchemaError, resolve

STAT_ROOT = "statsRegistry"
METADATA_SUFFIX = ".metadata"
METADATA_TYPE = "StatsRegistry_Metadata"
GETSTRUCT = re.compile(r"StatsRegistry_GetStruct([1-9][0-9]*)$")
EMPTY_OUTPUT = "KEL_Empty_Output"


def _printable(text):
    return text is None or all(" " <= ch <= "~" for ch in text)


def _check_texts(schema, errors):
    for t in schema.types:
        texts = [t.name, t.text] + [x for f in t.fields for x in (f.name, f.description)] + \
            [x for e in t.elements for x in (e.name, e.text)]
        if not all(_printable(x) for x in texts):
            errors.append(SchemaError(t.row, "type %s or one of its rows holds a character outside "
                                      "printable ASCII" % t.name))
    for n in schema.nodes:
        if not _printable(n.name):
            errors.append(SchemaError(n.row, "node name holds a character outside printable ASCII"))


def x86_align(t, memo, busy):
    """Alignment of a type on 32-bit x86; raises SchemaError when a type contains itself."""
    if t.name in memo:
        return memo[t.name]
    if t.name in busy:
        raise SchemaError(t.row, "type %s contains itself" % t.name)
    busy.add(t.name)
    if t.kind == "scalar":
        a = min(t.size, 4) if t.size else 1
    elif t.kind == "enum":
        a = 4
    elif t.kind == "array":
        a = x86_align(t.elem, memo, busy) if t.elem else 1
    else:
        a = max([x86_align(f.type, memo, busy) for f in t.fields if f.type] or [1])
    busy.discard(t.name)
    memo[t.name] = a
    return a


def _check_struct(t, memo, errors):
    if len(t.fields) != t.count:
        errors.append(SchemaError(t.row, "structure %s declares %d members but has %d field rows"
                                  % (t.name, t.count, len(t.fields))))
    names = {}
    prev = None
    for f in t.fields:
        if f.name in names:
            errors.append(SchemaError(f.row, "member name %s repeated in %s" % (f.name, t.name)))
        names[f.name] = f
        if f.type is None:
            continue
        size = f.type.size
        align = memo.get(f.type.name, 1)
        if f.offset % align:
            errors.append(SchemaError(f.row, "member %s at offset %d is not aligned to %d"
                                      % (f.name, f.offset, align)))
        if prev is not None:
            prev_end = prev.offset + prev.type.size
            if f.offset <= prev.offset:
                errors.append(SchemaError(f.row, "member %s at offset %d does not follow member "
                                          "%s at offset %d" % (f.name, f.offset, prev.name,
                                                               prev.offset)))
            elif f.offset < prev_end:
                errors.append(SchemaError(f.row, "member %s at offset %d overlaps member %s "
                                          "(ends at %d)" % (f.name, f.offset, prev.name, prev_end)))
        if f.offset + size > t.size:
            errors.append(SchemaError(f.row, "member %s (offset %d, %d bytes) ends past the end of "
                                      "%s (%d bytes)" % (f.name, f.offset, size, t.name, t.size)))
        prev = f
    if t.size % memo.get(t.name, 1):
        errors.append(SchemaError(t.row, "structure size %d is not a multiple of its alignment %d"
                                  % (t.size, memo[t.name])))


def _check_enum(t, element_names, errors):
    if t.size != 4:
        errors.append(SchemaError(t.row, "enumeration %s has size %d, not 4" % (t.name, t.size)))
    if len(t.elements) != t.count:
        errors.append(SchemaError(t.row, "enumeration %s declares %d elements but has %d elem rows"
                                  % (t.name, t.count, len(t.elements))))
    for e in t.elements:
        first = element_names.get(e.name)
        if first is not None:
            errors.append(SchemaError(e.row, "element name %s already used on line %d"
                                      % (e.name, first.row.line)))
        element_names[e.name] = e
        if t.flag_set and (e.value < 0 or e.value & (e.value - 1)):
            errors.append(SchemaError(e.row, "flag-set element %s has value %d, not 0 or one bit"
                                      % (e.name, e.value)))


def check_types(schema, errors):
    memo, symbols, element_names = {}, {}, {}
    for i, t in enumerate(schema.types):
        if t.index != i:
            errors.append(SchemaError(t.row, "type index %d out of order: expected %d"
                                      % (t.index, i)))
        if not IDENT.match(t.name):
            errors.append(SchemaError(t.row, "type name %r is not a C identifier" % t.name))
        symbol = t.table_symbol
        if symbol:
            if symbol in symbols:
                errors.append(SchemaError(t.row, "table name %s clashes with line %d"
                                          % (symbol, symbols[symbol].row.line)))
            symbols[symbol] = t
    for t in schema.types:
        try:
            x86_align(t, memo, set())
        except SchemaError as e:
            errors.append(e)
            return
    for t in schema.types:
        if t.kind == "scalar":
            if t.size not in (1, 2, 4, 8):
                errors.append(SchemaError(t.row, "scalar size %d is not 1, 2, 4 or 8" % t.size))
            if not t.text:
                errors.append(SchemaError(t.row, "scalar %s has no print format" % t.name))
        elif t.kind == "array":
            if t.elem is None:
                continue
            if t.elem.size == 0:
                errors.append(SchemaError(t.row, "array element type %s has size 0" % t.elem.name))
            elif t.size % t.elem.size:
                errors.append(SchemaError(t.row, "array size %d is not a multiple of the size %d "
                                          "of %s" % (t.size, t.elem.size, t.elem.name)))
        elif t.kind == "struct":
            _check_struct(t, memo, errors)
        else:
            _check_enum(t, element_names, errors)


def _expected_children(schema):
    children = {n.id: [] for n in schema.nodes}
    for n in schema.nodes[1:]:
        if n.parent in children:
            children[n.parent].append(n.id)
    for ids in children.values():
        ids.sort(reverse=True)
    return children


def _links_in_range(schema, errors):
    count, ok = len(schema.nodes), True
    for n in schema.nodes:
        for what, value, low in (("parent", n.parent, 0), ("sibling", n.sibling, -1),
                                 ("child", n.child, -1)):
            if not low <= value < count:
                errors.append(SchemaError(n.row, "%s %d is not a node id" % (what, value)))
                ok = False
    return ok


def _check_chains(schema, children, errors):
    for p in schema.nodes:
        ids = children[p.id]
        first = ids[0] if ids else -1
        if p.child != first:
            errors.append(SchemaError(p.row, "child is %d, expected %d (the highest-numbered node "
                                      "whose parent is %d)" % (p.child, first, p.id)))
        for k, cid in enumerate(ids):
            c = schema.nodes[cid]
            expected = ids[k + 1] if k + 1 < len(ids) else -1
            if c.sibling != expected:
                errors.append(SchemaError(c.row, "sibling is %d, expected %d (the next lower-numbered "
                                          "child of %d)" % (c.sibling, expected, p.id)))
        if p.is_leaf:
            for cid in ids:
                errors.append(SchemaError(schema.nodes[cid].row, "parent %d is a leaf" % p.id))


def _depths(schema, errors):
    """Depth of every node below the root; reports parent cycles."""
    depth = {0: 0}
    for n in schema.nodes:
        trail, cur = [], n
        while cur.id not in depth:
            trail.append(cur)
            if len(trail) > len(schema.nodes) or not 0 <= cur.parent < len(schema.nodes):
                errors.append(SchemaError(n.row, "node %d does not reach the root through its "
                                          "parents" % n.id))
                return None
            cur = schema.nodes[cur.parent]
        d = depth[cur.id]
        for t in reversed(trail):
            d += 1
            depth[t.id] = d
    return depth


def _check_node_records(n, errors):
    f = n.flags

    def err(message):
        errors.append(SchemaError(n.row, message))

    if not n.name or "/" in n.name:
        err("node name %r is empty or holds a '/'" % n.name)
    if not n.is_leaf:
        if f["hasInput"] or f["isUntypedLeaf"]:
            err("hasInput and isUntypedLeaf belong on leaves only")
        if n.out_name or n.in_name or n.out2_name:
            err("a branch declares no record types")
    if f["isIntegerInstance"] and not f["isInstance"]:
        err("isIntegerInstance without isInstance")
    if (f["flag4"] or f["flag5"]) and (n.is_leaf or not n.is_instance):
        err("flag4 and flag5 belong on instance branches only")
    if f["isUntypedLeaf"] and (n.out_name or n.out2_name or n.in_name):
        err("an untyped leaf declares a record type")
    if n.is_leaf and not f["isUntypedLeaf"] and n.out_name is None:
        err("a typed leaf needs an output type")
    if bool(f["hasInput"]) != (n.in_name is not None):
        err("hasInput must be set exactly when an input type is given")
    for what, t, size in (("output", n.out, n.out_size), ("input", n.inp, n.in_size),
                          ("second output", n.out2, n.out2_size)):
        expected = t.size if t is not None else 0
        if size != expected:
            err("%s size %d differs from %d, the size of %s"
                % (what, size, expected, t.name if t else "no type"))


def check_nodes(schema, errors):
    """Tree and record rules of the nodes; returns (children by parent, depth by id), or None
    (or a None depth) when the tree is too broken for the later checks."""
    if not schema.nodes:
        errors.append(SchemaError(None, "%s: error: no node rows" % schema.path))
        return None
    for i, n in enumerate(schema.nodes):
        if n.id != i:
            errors.append(SchemaError(n.row, "node id %d out of order: expected %d" % (n.id, i)))
            return None
    root = schema.nodes[0]
    if root.name != "root" or root.parent != 0 or root.sibling != -1 or root.is_leaf:
        errors.append(SchemaError(root.row, "node 0 must be the branch \"root\" with parent 0 and "
                                  "sibling -1"))
    for n in schema.nodes[1:]:
        if n.parent == n.id:
            errors.append(SchemaError(n.row, "node %d is its own parent" % n.id))
    if not _links_in_range(schema, errors):
        return None
    children = _expected_children(schema)
    _check_chains(schema, children, errors)
    depth = _depths(schema, errors)
    hashes = {}
    for n in schema.nodes:
        _check_node_records(n, errors)
        seen = set()
        for cid in sorted(children[n.id]):
            c = schema.nodes[cid]
            if c.name in seen:
                errors.append(SchemaError(c.row, "name %s repeated among the children of %d"
                                          % (c.name, n.id)))
            seen.add(c.name)
        if n.hash in hashes:
            errors.append(SchemaError(n.row, "hash 0x%016x already used by node %d"
                                      % (n.hash, hashes[n.hash])))
        hashes[n.hash] = n.id
    return children, depth


class _StatTree:
    """Walks the stat subtree and collects read nodes and .metadata leaves."""

    def __init__(self, schema, children, errors):
        self.schema, self.children, self.errors = schema, children, errors
        self.read_nodes = []
        self.metadata = []
        self.members = set()

    def err(self, node, msg):
        self.errors.append(SchemaError(node.row, msg))

    def exact_flags(self, node, expected, what):
        actual = {k for k, v in node.flags.items() if v}
        if actual != set(expected):
            self.err(node, "%s has flags {%s}; it must have {%s}"
                     % (what, ", ".join(sorted(actual)), ", ".join(sorted(expected))))

    def walk(self, top):
        self.members.add(top.id)
        self.exact_flags(top, (), "the stat subtree's top")
        for cid in self.children[top.id]:
            self.category(self.schema.nodes[cid])

    def category(self, cat):
        self.members.add(cat.id)
        self.exact_flags(cat, (), "a stat category")
        if cat.is_leaf:
            self.err(cat, "a stat category must be a branch")
            return
        for cid in self.children[cat.id]:
            n = self.schema.nodes[cid]
            self.members.add(n.id)
            if n.name.endswith(METADATA_SUFFIX):
                self.metadata_leaf(n)
            elif n.is_leaf:
                self.exact_flags(n, ("isLeaf",), "a stat read leaf without levels")
                if n.out2_name != EMPTY_OUTPUT:
                    self.err(n, "a stat read leaf without levels has second output %s"
                             % EMPTY_OUTPUT)
                self.read_node(n, cat)
            else:
                self.set_branch(n, cat)

    def metadata_leaf(self, n):
        self.exact_flags(n, ("isLeaf",), "a .metadata leaf")
        if n.out_name != METADATA_TYPE or n.out2_name is not None:
            self.err(n, "a .metadata leaf returns %s and has no second output" % METADATA_TYPE)
        if n.stat_link < 0:
            self.err(n, "a .metadata leaf's statLink is its stat id")
        self.metadata.append(n)

    def set_branch(self, n, cat):
        self.exact_flags(n, (), "a stat set branch")
        level, cur = 1, n
        while True:
            kids = self.children[cur.id]
            if len(kids) != 1:
                self.err(cur, "an instance chain node of a stat set needs exactly one child")
                return
            cur = self.schema.nodes[kids[0]]
            self.members.add(cur.id)
            if cur.name != "arg%d" % level:
                self.err(cur, "instance level %d of a stat set must be named arg%d"
                         % (level, level))
            allowed = ("isInstance", "isIntegerInstance") + (("isLeaf",) if cur.is_leaf else ())
            extra = [k for k, v in cur.flags.items() if v and k not in allowed]
            if extra or not cur.is_instance:
                self.err(cur, "a stat set's instance level has isInstance (and isIntegerInstance "
                         "for numbered instances) and no other flag but isLeaf")
            if cur.is_leaf:
                if cur.out2_name is not None:
                    self.err(cur, "a stat instance read leaf has no second output")
                self.read_node(cur, cat)
                return
            if cur.stat_link != -1:
                self.err(cur, "statLink is -1 on an outer instance level")
            level += 1

    def read_node(self, n, cat):
        m = GETSTRUCT.match(n.out_name or "")
        if not m:
            self.err(n, "a stat read node returns StatsRegistry_GetStructN, not %s" % n.out_name)
            return
        count = int(m.group(1))
        if n.out is not None and n.out.size != 4 + 16 * count:
            self.err(n, "%s has size %d, not 4 + 16 x %d" % (n.out_name, n.out.size, count))
        if n.stat_link != n.id + count:
            self.err(n, "statLink is %d, expected %d (the last of its %d .metadata leaves)"
                     % (n.stat_link, n.id + count, count))
        for leaf_id in range(n.id + 1, n.id + count + 1):
            leaf = self.schema.nodes[leaf_id] if leaf_id < len(self.schema.nodes) else None
            if leaf is None or leaf.parent != cat.id or not leaf.name.endswith(METADATA_SUFFIX):
                self.err(n, "node %d, one of the %d stats of read node %d, is not a .metadata "
                         "leaf of category %d" % (leaf_id, count, n.id, cat.id))
                return
        self.read_nodes.append((n, count))


def check_stat_subtree(schema, structure, errors):
    children, _ = structure
    top = [schema.nodes[c] for c in children[0] if schema.nodes[c].name == STAT_ROOT]
    stats = _StatTree(schema, children, errors)
    if top:
        stats.walk(top[0])
    claimed = {}
    for n, count in stats.read_nodes:
        for leaf_id in range(n.id + 1, n.id + count + 1):
            if leaf_id in claimed:
                errors.append(SchemaError(n.row, "metadata leaf %d also belongs to read node %d"
                                          % (leaf_id, claimed[leaf_id])))
            claimed[leaf_id] = n.id
    stat_ids = {}
    for leaf in stats.metadata:
        if leaf.id not in claimed:
            errors.append(SchemaError(leaf.row, "a .metadata leaf that follows no read node"))
        if leaf.stat_link in stat_ids:
            errors.append(SchemaError(leaf.row, "stat id %d already described by node %d"
                                      % (leaf.stat_link, stat_ids[leaf.stat_link])))
        stat_ids[leaf.stat_link] = leaf.id
    for leaf in stats.metadata:
        if leaf.stat_link >= len(stats.metadata):
            errors.append(SchemaError(leaf.row, "stat id %d is not below the number of stats %d"
                                      % (leaf.stat_link, len(stats.metadata))))
    linked = {n.id for n, _ in stats.read_nodes} | {m.id for m in stats.metadata}
    for n in schema.nodes:
        if n.id not in linked and n.stat_link != -1:
            errors.append(SchemaError(n.row, "statLink must be -1 outside the stat read nodes and "
                                      ".metadata leaves"))
        stat_instance_leaf = n.id in linked and (n.is_instance or n.name.endswith(METADATA_SUFFIX))
        typed_leaf = n.is_leaf and not n.flags["isUntypedLeaf"]
        if typed_leaf and not stat_instance_leaf and n.out2_name is None:
            errors.append(SchemaError(n.row, "a typed leaf needs a second output type "
                                      "(%s when it has none of its own)" % EMPTY_OUTPUT))
    return stats


def _unordered(t):
    values = [e.value for e in t.elements]
    return any(b < a for a, b in zip(values, values[1:]))


def metrics(schema, structure, stats):
    """The counts that expect rows name."""
    children, depth = structure
    types, nodes = schema.types, schema.nodes

    def kinds(kind):
        return sum(1 for t in types if t.kind == kind)

    def flag(name, leaf=None):
        return sum(1 for n in nodes if n.flags[name] and (leaf is None or n.is_leaf == leaf))

    return {
        "types": len(types),
        "scalars": kinds("scalar"),
        "arrays": kinds("array"),
        "structs": kinds("struct"),
        "enums": kinds("enum"),
        "flagSets": sum(1 for t in types if t.kind == "enum" and t.flag_set),
        "unorderedEnums": sum(1 for t in types if t.kind == "enum" and _unordered(t)),
        "openArrays": sum(1 for t in types if t.kind == "array" and t.size == 0),
        "nodes": len(nodes),
        "leaves": sum(1 for n in nodes if n.is_leaf),
        "branches": sum(1 for n in nodes if not n.is_leaf),
        "emptyBranches": sum(1 for n in nodes if not n.is_leaf and not children[n.id]),
        "instances": flag("isInstance"),
        "integerInstances": flag("isIntegerInstance"),
        "inputLeaves": flag("hasInput", True),
        "untypedLeaves": flag("isUntypedLeaf", True),
        "flag4": flag("flag4"),
        "flag5": flag("flag5"),
        "flag7": flag("flag7"),
        "flag7Leaves": flag("flag7", True),
        "parentAbove": sum(1 for n in nodes[1:] if n.parent > n.id),
        "maxDepth": max(depth.values()),
        "maxNameLength": max(len(n.name) for n in nodes),
        "rootChildren": len(children[0]),
        "statReadNodes": len(stats.read_nodes),
        "statMetadataLeaves": len(stats.metadata),
    }


def check_expectations(schema, values, errors):
    seen = {}
    for e in schema.expectations:
        if e.metric not in values:
            errors.append(SchemaError(e.row, "unknown metric %s (known: %s)"
                                      % (e.metric, ", ".join(sorted(values)))))
            continue
        if e.metric in seen:
            errors.append(SchemaError(e.row, "second expect row for %s (first on line %d)"
                                      % (e.metric, seen[e.metric].row.line)))
            continue
        seen[e.metric] = e
        if values[e.metric] != e.value:
            errors.append(SchemaError(e.row, "%s is %d, expected %d"
                                      % (e.metric, values[e.metric], e.value)))
    for metric in sorted(set(values) - set(seen)):
        errors.append(SchemaError(None, "%s: error: no expect row for %s (it is %d)"
                                  % (schema.path, metric, values[metric])))


def check(schema):
    """Checks every rule; returns the list of SchemaError (empty when the schema holds)."""
    errors = []
    resolve(schema, errors)
    if errors:
        return errors
    _check_texts(schema, errors)
    check_types(schema, errors)
    structure = check_nodes(schema, errors)
    if structure is None or structure[1] is None:
        return errors
    stats = check_stat_subtree(schema, structure, errors)
    if not errors:
        check_expectations(schema, metrics(schema, structure, stats), errors)
    return errors
