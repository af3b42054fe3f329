"""Parser and data model of the sysinfo definition file.

The file format is documented at the top of schema/sysinfo.schema. parse() turns the rows into
a Schema; every problem it meets is reported as a SchemaError naming the row. Type names used
by rows are resolved after the whole file is read, so rows may name types defined further down.
"""

import re
from dataclasses import dataclass, field
from typing import List, Optional

KINDS = ("scalar", "array", "struct", "enum")
KIND_CODE = {"scalar": 0, "array": 1, "struct": 2, "enum": 3}

# Node flag letters, in record order: isLeaf, hasInput, isUntypedLeaf, isInstance, flag4, flag5,
# isIntegerInstance, flag7.
FLAG_LETTERS = "LIUX45N7"
FLAG_NAMES = ("isLeaf", "hasInput", "isUntypedLeaf", "isInstance",
              "flag4", "flag5", "isIntegerInstance", "flag7")

IDENT = re.compile(r"[A-Za-z_][A-Za-z0-9_]*$")


@dataclass(frozen=True)
class Row:
    path: str
    line: int
    text: str

    def where(self):
        return "%s:%d" % (self.path, self.line)


class SchemaError(Exception):
    def __init__(self, row, message):
        super().__init__(message)
        self.row = row
        self.message = message

    def __str__(self):
        if self.row is None:
            return self.message
        return "%s: error: %s\n    %s" % (self.row.where(), self.message, self.row.text.strip())


@dataclass
class Field:
    name: str
    type_name: str
    offset: int
    description: str
    row: Row
    type: Optional["TypeDef"] = None


@dataclass
class Element:
    name: str
    value: int
    text: str
    row: Row


@dataclass
class TypeDef:
    index: int
    name: str
    kind: str
    size: int
    row: Row
    text: Optional[str] = None       # scalar format or struct/enum description; None for arrays
    count: int = 0                   # declared member or element count
    flag_set: int = 0
    elem_name: Optional[str] = None  # arrays: element type name
    elem: Optional["TypeDef"] = None
    fields: List[Field] = field(default_factory=list)
    elements: List[Element] = field(default_factory=list)

    @property
    def table_symbol(self):
        if self.kind == "struct":
            return self.name + "Fields"
        if self.kind == "enum":
            return self.name + "Elements"
        return None


@dataclass
class Node:
    id: int
    name: str
    parent: int
    sibling: int
    child: int
    flags: dict
    out_name: Optional[str]
    out_size: int
    in_name: Optional[str]
    in_size: int
    out2_name: Optional[str]
    out2_size: int
    stat_link: int
    hash: int
    row: Row
    out: Optional[TypeDef] = None
    inp: Optional[TypeDef] = None
    out2: Optional[TypeDef] = None

    @property
    def is_leaf(self):
        return self.flags["isLeaf"] == 1

    @property
    def is_instance(self):
        return self.flags["isInstance"] == 1


@dataclass
class Expectation:
    metric: str
    value: int
    row: Row


@dataclass
class Schema:
    path: str
    types: List[TypeDef] = field(default_factory=list)
    nodes: List[Node] = field(default_factory=list)
    expectations: List[Expectation] = field(default_factory=list)
    iface_hash: Optional[int] = None
    iface_row: Optional[Row] = None
    types_by_name: dict = field(default_factory=dict)


def tokenize(text, row):
    """Splits a row into tokens; a token in double quotes may hold blanks, \\" and \\\\."""
    tokens = []
    i, n = 0, len(text)
    while i < n:
        c = text[i]
        if c.isspace():
            i += 1
            continue
        if c == '"':
            i += 1
            out = []
            while True:
                if i >= n:
                    raise SchemaError(row, "unterminated string")
                c = text[i]
                if c == "\\":
                    if i + 1 >= n or text[i + 1] not in '"\\':
                        raise SchemaError(row, "bad escape in string (only \\\" and \\\\)")
                    out.append(text[i + 1])
                    i += 2
                    continue
                if c == '"':
                    i += 1
                    break
                out.append(c)
                i += 1
            if i < n and not text[i].isspace():
                raise SchemaError(row, "text after a closing quote")
            tokens.append(Quoted("".join(out)))
            continue
        j = i
        while j < n and not text[j].isspace():
            if text[j] == '"':
                raise SchemaError(row, "quote inside a word")
            j += 1
        tokens.append(text[i:j])
        i = j
    return tokens


class Quoted(str):
    """A token written in double quotes."""


def _int(tok, row, what, lo=None, hi=None):
    if isinstance(tok, Quoted):
        raise SchemaError(row, "%s must be a number, not a quoted text" % what)
    try:
        value = int(tok, 16) if tok.lower().startswith(("0x", "-0x")) else int(tok, 10)
    except ValueError:
        raise SchemaError(row, "%s is not a number: %r" % (what, tok)) from None
    if (lo is not None and value < lo) or (hi is not None and value > hi):
        raise SchemaError(row, "%s %d out of range" % (what, value))
    return value


def _text(tok, row, what):
    if not isinstance(tok, Quoted):
        raise SchemaError(row, "%s must be a quoted text" % what)
    return str(tok)


def _word(tok, row, what):
    if isinstance(tok, Quoted):
        raise SchemaError(row, "%s must be a plain word" % what)
    return tok


def _type_ref(tok, row, what):
    word = _word(tok, row, what)
    return None if word == "-" else word


def _arity(tokens, row, count, form):
    if len(tokens) != count:
        raise SchemaError(row, "expected %d fields (%s), found %d" % (count, form, len(tokens)))


U32 = 0xFFFFFFFF
I32_MIN, I32_MAX = -0x80000000, 0x7FFFFFFF


def _parse_type(tokens, row):
    if len(tokens) < 5:
        raise SchemaError(row, "a type row needs at least: type INDEX NAME KIND SIZE")
    index = _int(tokens[1], row, "type index", 0)
    name = _word(tokens[2], row, "type name")
    kind = _word(tokens[3], row, "type kind")
    if kind not in KINDS:
        raise SchemaError(row, "unknown type kind %r (scalar, array, struct, enum)" % kind)
    size = _int(tokens[4], row, "type size", 0, U32)
    t = TypeDef(index=index, name=name, kind=kind, size=size, row=row)
    if kind == "scalar":
        _arity(tokens, row, 6, "type INDEX NAME scalar SIZE \"FORMAT\"")
        t.text = _text(tokens[5], row, "scalar format")
    elif kind == "array":
        _arity(tokens, row, 6, "type INDEX NAME array SIZE ELEMENT_TYPE")
        t.elem_name = _word(tokens[5], row, "array element type")
    elif kind == "struct":
        _arity(tokens, row, 7, "type INDEX NAME struct SIZE COUNT \"DESCRIPTION\"")
        t.count = _int(tokens[5], row, "member count", 0, U32)
        t.text = _text(tokens[6], row, "structure description")
    else:
        _arity(tokens, row, 8, "type INDEX NAME enum SIZE COUNT FLAGSET \"DESCRIPTION\"")
        t.count = _int(tokens[5], row, "element count", 0, U32)
        t.flag_set = _int(tokens[6], row, "flag set marker", 0, 1)
        t.text = _text(tokens[7], row, "enumeration description")
    return t


def _parse_flags(tok, row):
    word = _word(tok, row, "node flags")
    if len(word) != len(FLAG_LETTERS):
        raise SchemaError(row, "node flags must have %d characters (%s or -)"
                          % (len(FLAG_LETTERS), FLAG_LETTERS))
    flags = {}
    for letter, c, name in zip(FLAG_LETTERS, word, FLAG_NAMES):
        if c not in (letter, "-"):
            raise SchemaError(row, "node flag character %r where %r or '-' belongs" % (c, letter))
        flags[name] = 1 if c == letter else 0
    return flags


def _parse_node(tokens, row):
    _arity(tokens, row, 15, "node ID NAME PARENT SIBLING CHILD FLAGS OUT OUTSIZE IN INSIZE "
                            "OUT2 OUT2SIZE STATLINK HASH")
    return Node(
        id=_int(tokens[1], row, "node id", 0),
        name=_word(tokens[2], row, "node name"),
        parent=_int(tokens[3], row, "parent", I32_MIN, I32_MAX),
        sibling=_int(tokens[4], row, "sibling", I32_MIN, I32_MAX),
        child=_int(tokens[5], row, "child", I32_MIN, I32_MAX),
        flags=_parse_flags(tokens[6], row),
        out_name=_type_ref(tokens[7], row, "output type"),
        out_size=_int(tokens[8], row, "output size", 0, U32),
        in_name=_type_ref(tokens[9], row, "input type"),
        in_size=_int(tokens[10], row, "input size", 0, U32),
        out2_name=_type_ref(tokens[11], row, "second output type"),
        out2_size=_int(tokens[12], row, "second output size", 0, U32),
        stat_link=_int(tokens[13], row, "statLink", I32_MIN, I32_MAX),
        hash=_int(tokens[14], row, "hash", 0, (1 << 64) - 1),
        row=row)


def parse(text, path):
    """Parses the definition file; raises SchemaError on the first malformed row."""
    schema = Schema(path=path)
    current = None  # the struct or enum that field/elem rows belong to
    for number, line in enumerate(text.splitlines(), start=1):
        stripped = line.strip()
        if not stripped or stripped.startswith("#"):
            continue
        row = Row(path, number, line)
        tokens = tokenize(stripped, row)
        head = tokens[0]
        if head == "type":
            current = _parse_type(tokens, row)
            schema.types.append(current)
        elif head == "field":
            _arity(tokens, row, 5, "field NAME TYPE OFFSET \"DESCRIPTION\"")
            if current is None or current.kind != "struct":
                raise SchemaError(row, "field row outside a structure")
            current.fields.append(Field(
                name=_word(tokens[1], row, "member name"),
                type_name=_word(tokens[2], row, "member type"),
                offset=_int(tokens[3], row, "member offset", 0, U32),
                description=_text(tokens[4], row, "member description"),
                row=row))
        elif head == "elem":
            _arity(tokens, row, 4, "elem NAME VALUE \"TEXT\"")
            if current is None or current.kind != "enum":
                raise SchemaError(row, "elem row outside an enumeration")
            current.elements.append(Element(
                name=_word(tokens[1], row, "element name"),
                value=_int(tokens[2], row, "element value", I32_MIN, I32_MAX),
                text=_text(tokens[3], row, "element text"),
                row=row))
        elif head == "node":
            current = None
            schema.nodes.append(_parse_node(tokens, row))
        elif head == "expect":
            current = None
            _arity(tokens, row, 3, "expect METRIC VALUE")
            schema.expectations.append(Expectation(
                metric=_word(tokens[1], row, "metric"),
                value=_int(tokens[2], row, "expected value", 0),
                row=row))
        elif head == "iface_hash":
            current = None
            _arity(tokens, row, 2, "iface_hash 0xHASH")
            if schema.iface_hash is not None:
                raise SchemaError(row, "second iface_hash row (first at line %d)"
                                  % schema.iface_row.line)
            schema.iface_hash = _int(tokens[1], row, "interface hash", 0, (1 << 64) - 1)
            schema.iface_row = row
        else:
            raise SchemaError(row, "unknown row kind %r" % head)
    if schema.iface_hash is None:
        raise SchemaError(None, "%s: error: no iface_hash row" % path)
    return schema


def resolve(schema, errors):
    """Resolves type names on every row; appends a SchemaError per unknown or repeated name."""
    for t in schema.types:
        if t.name in schema.types_by_name:
            first = schema.types_by_name[t.name]
            errors.append(SchemaError(t.row, "type name %s already used by type %d (line %d)"
                                      % (t.name, first.index, first.row.line)))
            continue
        schema.types_by_name[t.name] = t

    def lookup(name, row, what):
        if name is None:
            return None
        t = schema.types_by_name.get(name)
        if t is None:
            errors.append(SchemaError(row, "unknown %s %s" % (what, name)))
        return t

    for t in schema.types:
        if t.kind == "array":
            t.elem = lookup(t.elem_name, t.row, "array element type")
        for f in t.fields:
            f.type = lookup(f.type_name, f.row, "member type")
    for n in schema.nodes:
        n.out = lookup(n.out_name, n.row, "output type")
        n.inp = lookup(n.in_name, n.row, "input type")
        n.out2 = lookup(n.out2_name, n.row, "second output type")
