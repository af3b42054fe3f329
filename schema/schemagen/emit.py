"""C++ output: the header declaring the member and element tables, and the source defining all
exported schema data as constexpr (so constant-initialised: no code runs at load time).

Every pointer to a type record is written as &kelTypeDefsLookupTab[index], so it equals the
table base plus the index by construction.
"""

from .model import KIND_CODE

KIND_ENUM = {0: "KEL_KIND_SCALAR", 1: "KEL_KIND_ARRAY", 2: "KEL_KIND_STRUCT", 3: "KEL_KIND_ENUM"}


def c_string(text):
    if text is None:
        return "nullptr"
    out = []
    for ch in text:
        if ch in '"\\':
            out.append("\\" + ch)
        elif " " <= ch <= "~":
            out.append(ch)
        else:
            raise ValueError("text %r holds a character outside printable ASCII" % text)
    return '"%s"' % "".join(out)


def type_ptr(t):
    return "nullptr" if t is None else "&kelTypeDefsLookupTab[%d]" % t.index


def type_index(t):
    return -1 if t is None else t.index


def _table_decl(t):
    element = "KelField" if t.kind == "struct" else "KelEnumElement"
    bound = "" if t.count == 0 else str(t.count)
    return "const StatsRegistry::%s %s[%s]" % (element, t.table_symbol, bound)


def header(schema, source_name):
    lines = [
        "// Generated from %s by schema/gen_schema.py; do not edit." % source_name,
        "//",
        "// The member table of every structured type (<type>Fields) and the element table of",
        "// every enumerated type (<type>Elements) in kelTypeDefsLookupTab, exported under those",
        "// names. A type's record holds the count and a pointer to its table.",
        "// A structure without members (KEL_Empty_Output, KEL_Empty_Input) has its table declared",
        "// without a bound: C++ has no zero-length arrays, so the table holds one all-null record",
        "// that is not a member; the member count of 0 in the type's record is its length.",
        "#pragma once",
        "",
        '#include "tarnstats/SysinfoSchema.h"',
        "",
        'extern "C" {',
    ]
    for t in schema.types:
        if t.table_symbol:
            lines.append("TARNSTATS_EXPORT extern %s;" % _table_decl(t))
    lines += ["}", ""]
    return "\n".join(lines)


def _field(f):
    return "    {%s, %s, %d, %d, %s}," % (c_string(f.name), type_ptr(f.type), f.type.index,
                                         f.offset, c_string(f.description))


def _element(e):
    return "    {%s, %d, %s}," % (c_string(e.name), e.value, c_string(e.text))


def _tables(schema):
    lines = []
    for t in schema.types:
        if not t.table_symbol:
            continue
        element = "KelField" if t.kind == "struct" else "KelEnumElement"
        lines.append("constexpr %s %s[%d] = {" % (element, t.table_symbol, max(t.count, 1)))
        if t.kind == "struct":
            lines += [_field(f) for f in t.fields] or ["    {nullptr, nullptr, 0, 0, nullptr},"]
        else:
            lines += [_element(e) for e in t.elements] or ["    {nullptr, 0, nullptr},"]
        lines.append("};")
    return lines


def _type_record(t):
    if t.kind == "scalar":
        ref, table = "KelTypeRef()", "KelTypeTable()"
    elif t.kind == "array":
        ref = "KelTypeRef(%s)" % type_ptr(t.elem)
        table = "KelTypeTable(uintptr_t{%d})" % t.elem.index
    else:
        ref = "KelTypeRef(uintptr_t{%d})" % t.count
        table = "KelTypeTable(%s)" % t.table_symbol
    text = None if t.kind == "array" else t.text
    return "    /* %4d */ {%s, %s, %d, %s, %s, %s, %d}," % (
        t.index, c_string(t.name), KIND_ENUM[KIND_CODE[t.kind]], t.size, c_string(text), ref,
        table, t.flag_set)


def _node_record(n):
    f = n.flags
    flags = ", ".join(str(f[k]) for k in ("isLeaf", "hasInput", "isUntypedLeaf", "isInstance",
                                          "flag4", "flag5", "isIntegerInstance", "flag7"))
    return "    {%d, %s, %d, %d, %d, %d, %d, %d, %d, %d, %d, %d, 0x%016xULL, %s, %s, %s, %s}," % (
        n.id, flags, n.parent, n.sibling, n.child, n.out_size, type_index(n.out), n.in_size,
        type_index(n.inp), n.out2_size, type_index(n.out2), n.stat_link, n.hash,
        c_string(n.name), type_ptr(n.out), type_ptr(n.inp), type_ptr(n.out2))


def source(schema, source_name, header_name):
    lines = [
        "// Generated from %s by schema/gen_schema.py; do not edit." % source_name,
        "// All data is constexpr: constant-initialised, no code runs when the library loads.",
        '#include "%s"' % header_name,
        "",
        "using StatsRegistry::KelEnumElement;",
        "using StatsRegistry::KelField;",
        "using StatsRegistry::KelNode;",
        "using StatsRegistry::KelTypeDef;",
        "using StatsRegistry::KelTypeRef;",
        "using StatsRegistry::KelTypeTable;",
        "using StatsRegistry::KEL_KIND_ARRAY;",
        "using StatsRegistry::KEL_KIND_ENUM;",
        "using StatsRegistry::KEL_KIND_SCALAR;",
        "using StatsRegistry::KEL_KIND_STRUCT;",
        "",
        'extern "C" {',
        "",
        "constexpr uint32_t kelMaxTypeDefs = %d;" % len(schema.types),
        "constexpr uint32_t kelMaxNodes = %d;" % len(schema.nodes),
        "constexpr uint64_t KEL_ALL_IFACE_HASH = 0x%016xULL;" % schema.iface_hash,
        "",
    ]
    lines += _tables(schema)
    lines += ["", "constexpr KelTypeDef kelTypeDefsLookupTab[%d] = {" % len(schema.types)]
    lines += [_type_record(t) for t in schema.types]
    lines += ["};", "", "constexpr KelNode kelNodesLookupTab[%d] = {" % len(schema.nodes)]
    lines += [_node_record(n) for n in schema.nodes]
    lines += ["};", "", '}  // extern "C"', ""]
    return "\n".join(lines)
