#!/usr/bin/env python3
"""The schema generator on the committed definitions and on broken copies of them.

Usage: test_gen_schema.py GENERATOR DEFINITIONS [unittest options]

Each broken copy changes one row of the real definitions; the generator must then fail, name
that row as FILE:LINE with a message saying what is wrong, print the row, and write nothing.
"""

import os
import re
import subprocess
import sys
import tempfile
import unittest

GENERATOR = DEFINITIONS = None


def run(definitions, outdir=None):
    cmd = [sys.executable, GENERATOR, definitions]
    if outdir:
        cmd += ["--header", os.path.join(outdir, "t.h"), "--source", os.path.join(outdir, "t.cpp")]
    return subprocess.run(cmd, capture_output=True, text=True, timeout=120)


class Definitions:
    """The real definitions as lines, with helpers to change one row."""

    def __init__(self):
        with open(DEFINITIONS, encoding="utf-8") as f:
            self.lines = f.read().split("\n")

    def find(self, pattern):
        regex = re.compile(pattern)
        hits = [i for i, line in enumerate(self.lines) if regex.match(line)]
        assert len(hits) == 1, (pattern, len(hits))
        return hits[0]

    def node(self, node_id):
        return self.find(r"node %d " % node_id)

    def set_column(self, index, column, value):
        """Replaces blank-separated column `column` (0 = row kind) of line `index`."""
        indent = re.match(r"\s*", self.lines[index]).group(0)
        parts = self.lines[index].split()
        parts[column] = str(value)
        self.lines[index] = indent + " ".join(parts)
        return index

    def text(self):
        return "\n".join(self.lines)


# Node row columns: node ID NAME PARENT SIBLING CHILD FLAGS OUT OUTSIZE IN INSIZE OUT2 OUT2SIZE
# STATLINK HASH
NAME, PARENT, SIBLING, CHILD, FLAGS, OUT, OUTSIZE = 2, 3, 4, 5, 6, 7, 8
STATLINK, HASH = 13, 14


class GeneratorTest(unittest.TestCase):
    def setUp(self):
        self.tmp = tempfile.TemporaryDirectory()
        self.addCleanup(self.tmp.cleanup)

    def expect_refusal(self, defs, index, message):
        """The broken copy fails with `message` on line index + 1, and no output is written."""
        path = os.path.join(self.tmp.name, "broken.schema")
        with open(path, "w", encoding="utf-8") as f:
            f.write(defs.text())
        out = os.path.join(self.tmp.name, "out")
        result = run(path, out)
        self.assertEqual(result.returncode, 1, result.stderr)
        where = "%s:%d: error: " % (path, index + 1)
        reports = result.stderr.split("\n")
        hits = [k for k, line in enumerate(reports) if line.startswith(where) and message in line]
        self.assertTrue(hits, "no report of %r at %s in:\n%s" % (message, where, result.stderr))
        self.assertEqual(reports[hits[0] + 1].strip(), defs.lines[index].strip())
        self.assertFalse(os.path.exists(out), "outputs written for broken definitions")

    def test_committed_definitions_generate_the_same_output_twice(self):
        first, second = (os.path.join(self.tmp.name, d) for d in ("a", "b"))
        for outdir in (first, second):
            result = run(DEFINITIONS, outdir)
            self.assertEqual(result.returncode, 0, result.stderr)
            self.assertEqual(result.stderr, "")
        for name in ("t.h", "t.cpp"):
            with open(os.path.join(first, name)) as a, open(os.path.join(second, name)) as b:
                self.assertEqual(a.read(), b.read())
        with open(os.path.join(first, "t.cpp")) as f:
            source = f.read()
        self.assertIn("constexpr KelNode kelNodesLookupTab[1711]", source)
        self.assertIn("constexpr KelTypeDef kelTypeDefsLookupTab[1061]", source)
        self.assertNotIn("reinterpret_cast", source)

    # Tree rules.

    def test_parent_that_is_a_leaf(self):
        defs = Definitions()
        index = defs.set_column(defs.node(1315), PARENT, 1316)
        self.expect_refusal(defs, index, "parent 1316 is a leaf")

    def test_parent_moved_to_another_branch(self):
        # 1562 moved from arg1 (1561) to the set branch: both chains now disagree with parents.
        defs = Definitions()
        index = defs.set_column(defs.node(1562), PARENT, 1560)
        self.expect_refusal(defs, index, "sibling is -1, expected 1561")
        self.expect_refusal(defs, defs.node(1561), "child is 1562, expected -1")

    def test_child_chain_out_of_order(self):
        defs = Definitions()
        index = defs.set_column(defs.node(412), SIBLING, 1)  # skips net (2)
        self.expect_refusal(defs, index, "sibling is 1, expected 2")

    def test_chain_start_is_not_the_highest_child(self):
        defs = Definitions()
        index = defs.set_column(defs.node(0), CHILD, 1558)
        self.expect_refusal(defs, index, "child is 1558, expected 1706")

    def test_parent_cycle(self):
        defs = Definitions()
        defs.set_column(defs.node(1560), PARENT, 1561)
        self.expect_refusal(defs, defs.node(1560), "does not reach the root")

    def test_name_repeated_among_siblings(self):
        defs = Definitions()
        index = defs.set_column(defs.node(1317), NAME, "stats")
        self.expect_refusal(defs, index, "name stats repeated among the children of 1314")

    def test_repeated_hash(self):
        defs = Definitions()
        hash_1315 = defs.lines[defs.node(1315)].split()[HASH]
        index = defs.set_column(defs.node(1316), HASH, hash_1315)
        self.expect_refusal(defs, index, "already used by node 1315")

    # Record rules.

    def test_output_size_differs_from_its_type(self):
        defs = Definitions()
        index = defs.set_column(defs.node(1315), OUTSIZE, 17)
        self.expect_refusal(defs, index, "output size 17 differs from 16")

    def test_unknown_type_name(self):
        defs = Definitions()
        index = defs.set_column(defs.node(1315), OUT, "VSCSIKel_NoSuchType")
        self.expect_refusal(defs, index, "unknown output type VSCSIKel_NoSuchType")

    def test_branch_with_a_record_type(self):
        defs = Definitions()
        index = defs.node(1314)
        defs.set_column(index, OUT, "KEL_DEC_U32")
        defs.set_column(index, OUTSIZE, 4)
        self.expect_refusal(defs, index, "a branch declares no record types")

    def test_member_past_the_structure_end(self):
        defs = Definitions()
        start = defs.find(r"type 991 StatsRegistry_Stat ")
        index = defs.set_column(start + 2, 3, 12)  # "value" from offset 8 to 12
        self.expect_refusal(defs, index, "ends past the end of StatsRegistry_Stat (16 bytes)")

    def test_overlapping_members(self):
        defs = Definitions()
        start = defs.find(r"type 1045 StatsRegistry_Attribute ")
        index = defs.set_column(start + 3, 3, 4)  # "name" onto "type"
        self.expect_refusal(defs, index, "does not follow member type")

    def test_misaligned_member(self):
        defs = Definitions()
        start = defs.find(r"type 22 KELCompatData ")
        index = defs.set_column(start + 2, 3, 16386)
        self.expect_refusal(defs, index, "is not aligned to 4")

    def test_array_size_not_a_multiple_of_its_element(self):
        defs = Definitions()
        index = defs.set_column(defs.find(r"type 994 StatsRegistry_GetArray2 "), 4, 40)
        self.expect_refusal(defs, index, "array size 40 is not a multiple of the size 16")

    # Counts.

    def test_member_count_differs_from_the_field_rows(self):
        defs = Definitions()
        index = defs.set_column(defs.find(r"type 22 KELCompatData "), 5, 3)
        self.expect_refusal(defs, index, "declares 3 members but has 2 field rows")

    def test_element_count_differs_from_the_elem_rows(self):
        defs = Definitions()
        index = defs.set_column(defs.find(r"type 984 SRStatObjectType "), 5, 12)
        self.expect_refusal(defs, index, "declares 12 elements but has 13 elem rows")

    def test_table_count_differs_from_the_expected_one(self):
        defs = Definitions()
        index = defs.set_column(defs.find(r"expect leaves "), 2, 1346)
        self.expect_refusal(defs, index, "leaves is 1345, expected 1346")

    def test_flag_count_differs(self):
        # One more flag7 leaf: the rows still hold, the count no longer does.
        defs = Definitions()
        index = defs.node(1315)
        defs.set_column(index, FLAGS, "L------7")
        self.expect_refusal(defs, defs.find(r"expect flag7 "), "flag7 is 171, expected 170")

    # The stat subtree.

    def test_read_node_stat_link(self):
        defs = Definitions()
        index = defs.set_column(defs.node(1590), STATLINK, 1594)
        self.expect_refusal(defs, index, "statLink is 1594, expected 1595")

    def test_read_node_record_of_the_wrong_set_size(self):
        defs = Definitions()
        index = defs.node(1562)
        defs.set_column(index, OUT, "StatsRegistry_GetStruct3")
        defs.set_column(index, OUTSIZE, 52)
        self.expect_refusal(defs, index, "statLink is 1564, expected 1565")

    def test_instance_level_without_its_flag(self):
        defs = Definitions()
        index = defs.set_column(defs.node(1561), FLAGS, "--------")
        self.expect_refusal(defs, index, "instance level has isInstance")

    # Syntax.

    def test_malformed_rows(self):
        for column, value, message in ((FLAGS, "L--Q----", "node flag character 'Q'"),
                                       (PARENT, "x12", "parent is not a number"),
                                       (OUTSIZE, '"16"', "must be a number")):
            with self.subTest(message=message):
                defs = Definitions()
                index = defs.set_column(defs.node(1315), column, value)
                self.expect_refusal(defs, index, message)


if __name__ == "__main__":
    if len(sys.argv) < 3:
        sys.exit(__doc__)
    GENERATOR, DEFINITIONS = sys.argv[1], sys.argv[2]
    unittest.main(argv=[sys.argv[0]] + sys.argv[3:], verbosity=2)
