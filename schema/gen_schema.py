#!/usr/bin/env python3
"""Checks the sysinfo definitions and generates the schema tables' C++ header and source.

Usage: gen_schema.py DEFINITIONS [--header FILE --source FILE]

Without outputs it only checks. Every broken rule is reported as
"FILE:LINE: error: MESSAGE" followed by the row, and the exit status is 1. Outputs are written
only when all rules hold.
"""

import argparse
import os
import sys

sys.dont_write_bytecode = True  # keep the source tree clean when run from the build
sys.path.insert(0, os.path.dirname(os.path.abspath(__file__)))

from schemagen import emit, model, rules  # noqa: E402

MAX_REPORTED = 50


def write_if_changed(path, text):
    """Writes `text` unless the file already holds it; then only its time is updated, so that
    the build sees the output as newer than the definitions."""
    try:
        with open(path, encoding="ascii") as f:
            if f.read() == text:
                os.utime(path)
                return
    except OSError:
        pass
    os.makedirs(os.path.dirname(os.path.abspath(path)), exist_ok=True)
    tmp = path + ".tmp"
    with open(tmp, "w", encoding="ascii") as f:
        f.write(text)
    os.replace(tmp, path)


def main(argv):
    parser = argparse.ArgumentParser(description=__doc__.splitlines()[0])
    parser.add_argument("definitions")
    parser.add_argument("--header", help="generated header to write")
    parser.add_argument("--source", help="generated C++ source to write")
    parser.add_argument("--header-include", default="tarnstats/SysinfoSchemaTables.h",
                        help="include path of the header as the source names it")
    args = parser.parse_args(argv)
    if bool(args.header) != bool(args.source):
        parser.error("--header and --source go together")

    with open(args.definitions, encoding="utf-8") as f:
        text = f.read()
    try:
        schema = model.parse(text, args.definitions)
        errors = rules.check(schema)
    except model.SchemaError as e:
        errors = [e]
    if errors:
        for e in errors[:MAX_REPORTED]:
            print(e, file=sys.stderr)
        if len(errors) > MAX_REPORTED:
            print("... and %d more" % (len(errors) - MAX_REPORTED), file=sys.stderr)
        print("%s: %d error(s); no tables generated" % (args.definitions, len(errors)),
              file=sys.stderr)
        return 1
    if args.header:
        name = os.path.basename(args.definitions)
        write_if_changed(args.header, emit.header(schema, name))
        write_if_changed(args.source, emit.source(schema, name, args.header_include))
    return 0


if __name__ == "__main__":
    sys.exit(main(sys.argv[1:]))
