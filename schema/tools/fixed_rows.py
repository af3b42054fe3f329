"""The rows of the sysinfo definitions that the library and its users rely on.

Used by make_definitions.py, which adds the placeholder rows around them.
"""

IFACE_HASH = 0x16b7e0427b0d1430

# Basic types 0-20: (name, kind, size, format or description).
BASIC_TYPES = [
    ("KEL_STRING", "scalar", 1, "%s"),
    ("KEL_CHAR_U8", "scalar", 1, "%c"),
    ("KEL_BOOL", "scalar", 1, "%u"),
    ("KEL_DEC_U8", "scalar", 1, "%u"),
    ("KEL_HEX_U8", "scalar", 1, "0x%02x "),
    ("KEL_DEC_S16", "scalar", 2, "%d"),
    ("KEL_DEC_U16", "scalar", 2, "%u"),
    ("KEL_HEX_U16", "scalar", 2, "0x%04x"),
    ("KEL_DEC_S32", "scalar", 4, "%d"),
    ("KEL_DEC_U32", "scalar", 4, "%u"),
    ("KEL_HEX_U32", "scalar", 4, "0x%08x"),
    ("KEL_DEC_S64", "scalar", 8, "%Ld"),
    ("KEL_DEC_U64", "scalar", 8, "%Lu"),
    ("KEL_HEX_U64", "scalar", 8, "0x%Lx"),
    ("KEL_Empty_Output", "struct", 0, "Empty output data"),
    ("KEL_Empty_Input", "struct", 0, "Empty input data"),
    ("KEL_TIME_UNIT", "enum", 4, "Time unit"),
    ("KEL_KILOBYTE", "scalar", 8, "%Lu KB"),
    ("KEL_MEGABYTE", "scalar", 4, "%u MB"),
    ("KEL_GIGABYTE", "scalar", 4, "%u GB"),
    ("KEL_VA", "scalar", 8, "%#x"),
]

KEL_TIME_UNIT_ELEMENTS = [
    ("KelTime_Seconds", 0, "s"),
    ("KelTime_Milliseconds", 1, "ms"),
    ("KelTime_Microseconds", 2, "us"),
    ("KelTime_Nanoseconds", 3, "ns"),
    ("KelTime_TimerCycles", 4, "tc"),
]

VSCSI_DEVNAME_INDEX = 767

# Enumerations 984-990 and 1044: (index, name, description, elements).
STAT_ENUMS = [
    (984, "SRStatObjectType", "Object Type", [
        ("SR_OBJECTTYPE_VIRTUALMACHINE", 0, "VM"),
        ("SR_OBJECTTYPE_VIRTUALCPU", 1, "vCpu"),
        ("SR_OBJECTTYPE_VIRTUALNIC", 2, "vNic"),
        ("SR_OBJECTTYPE_VIRTUALDISK", 3, "vDisk"),
        ("SR_OBJECTTYPE_VM_LUN", 4, "vmLUN"),
        ("SR_OBJECTTYPE_HOST", 5, "host"),
        ("SR_OBJECTTYPE_PHYSICALCPU", 6, "pCpu"),
        ("SR_OBJECTTYPE_PHYSICALNIC", 7, "pNic"),
        ("SR_OBJECTTYPE_STORAGEADAPTER", 8, "storageAdapter"),
        ("SR_OBJECTTYPE_STORAGEPATH", 9, "storagePath"),
        ("SR_OBJECTTYPE_HOST_LUN", 10, "hostLUN"),
        ("SR_OBJECTTYPE_DATASTORE", 11, "datastore"),
        ("SR_OBJECTTYPE_LUN", 12, "LUN"),
    ]),
    (985, "SRStatTransformType", "Transform Type", [
        ("SR_TRANSFORMTYPE_NONE", 0, "none"),
        ("SR_TRANSFORMTYPE_DELTA", 1, "delta"),
        ("SR_TRANSFORMTYPE_RATE", 2, "rate"),
    ]),
    (986, "SRStatValueType", "Value Type", [
        ("SR_VALUETYPE_ABSOLUTE", 0, "absolute"),
        ("SR_VALUETYPE_DELTA", 1, "delta"),
        ("SR_VALUETYPE_RATE", 2, "rate"),
    ]),
    (987, "SRStatUnit", "Unit", [
        ("SR_UNIT_PERCENT", 0, "percent"),
        ("SR_UNIT_KILOBYTE", 1, "kiloBytes"),
        ("SR_UNIT_MEGABYTE", 2, "megaBytes"),
        ("SR_UNIT_MEGAHERTZ", 3, "megaHertz"),
        ("SR_UNIT_NUMBER", 4, "number"),
        ("SR_UNIT_MICROSECOND", 5, "microsecond"),
        ("SR_UNIT_MILLISECOND", 6, "millisecond"),
        ("SR_UNIT_SECOND", 7, "second"),
        ("SR_UNIT_KILOBYTEPERSECOND", 8, "kiloBytesPerSecond"),
        ("SR_UNIT_MEGABYTEPERSECOND", 9, "megaBytesPerSecond"),
        ("SR_UNIT_WATT", 10, "watt"),
        ("SR_UNIT_JOULE", 11, "joule"),
    ]),
    (988, "SRStatRollupType", "Rollup Type", [
        ("SR_ROLLUP_NONE", 0, "none"),
        ("SR_ROLLUP_AVERAGE", 1, "average"),
        ("SR_ROLLUP_MAX", 2, "max"),
        ("SR_ROLLUP_MIN", 3, "min"),
        ("SR_ROLLUP_LATEST", 4, "latest"),
        ("SR_ROLLUP_SUMMATION", 5, "summation"),
    ]),
    (989, "SRStatOptions", "Stat Options", [
        ("SR_STATOPTIONS_INVALID", 0, "no flags"),
        ("SR_STATOPTIONS_HIDDEN", 1, "hidden"),
    ]),
    (990, "SRStatIdMappingType", "Id mapping type", [
        ("SR_IDMAPTYPE_IDENTITY", 0, "identity"),
        ("SR_IDMAPTYPE_VM_MOID_TO_WORLDID", 1, "VM moid to world id"),
        ("SR_IDMAPTYPE_VM_MOID_TO_WORLDGROUPID", 2, "VM moid to world group id"),
        ("SR_IDMAPTYPE_VM_MOID", 3, "VM moid"),
        ("SR_IDMAPTYPE_VDISK_TO_VSCSI_HANDLE", 4, "vDisk to vScsi handle"),
        ("SR_IDMAPTYPE_VNIC_TO_PORT_ID", 5, "vNic to port id"),
    ]),
    (1044, "SRStatParamType", "Param type", [
        ("SR_PARAMTYPE_INT", 0, "int"),
        ("SR_PARAMTYPE_STRING", 1, "string"),
    ]),
]

# The root's children: (id, name, subtree size).
ROOT_CHILDREN = [
    (1, "sysInfoNodeHashes", 1), (2, "net", 410), (412, "memory", 42), (453, "rpcStats", 1),
    (454, "vm", 9), (463, "world", 29), (492, "worldGroups", 38), (518, "config", 3),
    (521, "reliability", 82), (601, "hardware", 66), (652, "sched", 228),
    (880, "userworld", 234), (1123, "system", 198), (1128, "tarnModules", 1),
    (1313, "storage", 115), (1345, "timer", 4), (1372, "perf", 49), (1442, "power", 17),
    (1475, "worldlets", 17), (1498, "tarnAccess", 17), (1518, "killswitches", 2),
    (1558, "statsRegistry", 142), (1706, "tpm", 5),
]

# Subtrees whose ids are spread over several ranges; every other subtree is one range.
SPREAD = {"memory", "worldGroups", "reliability", "hardware", "system", "storage", "perf"}

# The virtual SCSI rows below worldGroups: (id, name, parent).
VSCSI_ROWS = [(1314, "vscsi", 492), (1315, "name", 1314), (1316, "stats", 1314),
              (1317, "shares", 1314), (1318, "bandwidthCap", 1314),
              (1319, "throughputCap", 1314)]

STAT_CATEGORIES = [
    (1559, "disk"), (1568, "diskThroughput"), (1576, "virtualDisk"),
    (1577, "virtualDiskThroughput"), (1588, "storageAdapter"), (1596, "storageAdapterThroughput"),
    (1601, "storagePath"), (1606, "storagePathThroughput"), (1611, "net"),
    (1612, "netThroughput"), (1633, "netThroughputUsage"), (1652, "cpuCapacity"),
    (1664, "cpuCoreCount"), (1677, "mem"), (1692, "powerCapacity"),
]

# Read nodes: (category, set branch (id, name) or None, levels [(id, "int"|"str")],
#              read node id, read leaf name when there is no set branch, first stat, stats).
STAT_READS = [
    (1559, (1560, "vmLunDiskSetXvmLUN"), [(1561, "int"), (1562, "str")], 1562, None, 0, 2),
    (1559, (1565, "scsiReservationConflictsXhostLUN"), [(1566, "str")], 1566, None, 2, 1),
    (1568, None, [], 1569, "hostDiskThroughputSetXhost", 3, 2),
    (1568, (1572, "vmDiskThroughputSetXVM"), [(1573, "int")], 1573, None, 5, 2),
    (1577, (1578, "virtualDiskThroughputSetXvDisk"), [(1579, "int"), (1580, "int")], 1580, None,
     7, 2),
    (1576, (1583, "virtualDiskSetXvDisk"), [(1584, "int"), (1585, "int")], 1585, None, 9, 2),
    (1588, (1589, "storageAdapterSetXstorageAdapter"), [(1590, "str")], 1590, None, 11, 5),
    (1596, (1597, "storageAdapterThroughputSetXstorageAdapter"), [(1598, "str")], 1598, None,
     16, 2),
    (1601, (1602, "storagePathSetXstoragePath"), [(1603, "str")], 1603, None, 18, 2),
    (1606, (1607, "storagePathThroughputSetXstoragePath"), [(1608, "str")], 1608, None, 20, 2),
    (1612, None, [], 1613, "hostNetThroughputSetXhost", 22, 4),
    (1612, (1618, "netThroughputSetXpNic"), [(1619, "str")], 1619, None, 26, 5),
    (1612, (1625, "netThroughputSetXVM"), [(1626, "int")], 1626, None, 31, 2),
    (1612, (1629, "netThroughputSetXvNic"), [(1630, "int")], 1630, None, 33, 2),
    (1633, (1634, "vmXpNic"), [(1635, "str")], 1635, None, 35, 1),
    (1633, (1637, "nfsXpNic"), [(1638, "str")], 1638, None, 36, 1),
    (1633, (1640, "livemigXpNic"), [(1641, "str")], 1641, None, 37, 1),
    (1633, (1643, "ftXpNic"), [(1644, "str")], 1644, None, 38, 1),
    (1633, (1646, "iscsiXpNic"), [(1647, "str")], 1647, None, 39, 1),
    (1633, (1649, "hbrXpNic"), [(1650, "str")], 1650, None, 40, 1),
    (1652, (1653, "vmCpuCapacitySetXVM"), [(1654, "int")], 1654, None, 41, 4),
    (1652, None, [], 1659, "hostCpuCapacitySetXhost", 45, 4),
    (1664, (1665, "vcpuCpuCoreCountSetXvCpu"), [(1666, "int"), (1667, "int")], 1667, None, 49, 1),
    (1664, (1669, "vmCpuCoreCountSetXVM"), [(1670, "int")], 1670, None, 50, 2),
    (1664, None, [], 1673, "hostCpuCoreCountSetXhost", 52, 3),
    (1677, None, [], 1678, "hostMemSetXhost", 55, 7),
    (1677, (1686, "vmMemSetXVM"), [(1687, "int")], 1687, None, 62, 4),
    (1692, None, [], 1693, "hostPowerCapacitySetXhost", 66, 3),
    (1692, (1697, "VMPowerCapacitySetXVM"), [(1698, "int")], 1698, None, 69, 1),
]

METADATA_NAMES = """
scsiReservationConflictsXvmLUN scsiReservationCnflctsPctXvmLUN scsiReservationConflictsXhostLUN
usageXhost contentionXhost usageXVM contentionXVM usageXvDisk contXvDisk commandsAbortedXvDisk
busResetsXvDisk outstandingIOsXstorageAdapter OIOsPctXstorageAdapter queuedXstorageAdapter
queueDepthXstorageAdapter queueLatencyXstorageAdapter usagXstorageAdapter contXstorageAdapter
busResetsXstoragePath commandsAbortedXstoragePath usageXstoragePath contXstoragePath
provisionedXhost usableXhost usageXhost contentionXhost provisionedXpNic usableXpNic usageXpNic
contentionXpNic packetsPerSecXpNic usageXVM contentionXVM usageXvNic contentionXvNic vmXpNic
nfsXpNic livemigXpNic ftXpNic iscsiXpNic hbrXpNic entitlementXVM usageXVM demandXVM
contentionXVM provisionedXhost usageXhost demandXhost contentionXhost contentionXvCpu
provisionedXVM contentionXVM provisionedXhost usageXhost contentionXhost
reservedCapacityPctXhost capacityOprovisionedXhost capacityOusableXhost capacityOusageXhost
capacityOcontentionXhost consumedOvmsXhost consumedOuserworldsXhost capacityOprovisionedXVM
capacityOentitlementXVM capacityOusageXVM capacityOcontentionXVM usableXhost usageXhost
usagePctXhost usageXVM
""".split()
assert len(METADATA_NAMES) == 70

# Counts of the whole tables, written as expect rows.
EXPECT = [
    ("types", 1061), ("scalars", 88), ("arrays", 311), ("structs", 526), ("enums", 136),
    ("flagSets", 29), ("unorderedEnums", 4), ("openArrays", 2),
    ("nodes", 1711), ("leaves", 1345), ("branches", 366), ("emptyBranches", 7),
    ("instances", 310), ("integerInstances", 191), ("inputLeaves", 5), ("untypedLeaves", 3),
    ("flag4", 1), ("flag5", 2), ("flag7", 170), ("flag7Leaves", 163), ("parentAbove", 19),
    ("maxDepth", 7), ("maxNameLength", 42), ("rootChildren", 23), ("statReadNodes", 29),
    ("statMetadataLeaves", 70),
]


def stat_types():
    """Types 984-1047 as (index, dict) in index order."""
    out = {}
    for index, name, desc, elems in STAT_ENUMS:
        out[index] = dict(name=name, kind="enum", size=4, text=desc, elems=elems, flag_set=0)
    out[991] = dict(name="StatsRegistry_Stat", kind="struct", size=16, text="Stat", fields=[
        ("id", "KEL_DEC_U64", 0, "stat id"), ("value", "KEL_DEC_S64", 8, "stat value")])
    for n in range(1, 26):
        out[990 + 2 * n] = dict(name="StatsRegistry_GetArray%d" % n, kind="array", size=16 * n,
                                elem="StatsRegistry_Stat")
        out[991 + 2 * n] = dict(
            name="StatsRegistry_GetStruct%d" % n, kind="struct", size=4 + 16 * n,
            text="StatSet get struct %d" % n,
            fields=[("numStats", "KEL_DEC_U32", 0, "number of stats"),
                    ("stats", "StatsRegistry_GetArray%d" % n, 4, "stats")])
    out[1042] = dict(name="StatsRegistry_String64", kind="array", size=64, elem="KEL_STRING")
    out[1043] = dict(name="StatsRegistry_String128", kind="array", size=128, elem="KEL_STRING")
    out[1045] = dict(name="StatsRegistry_Attribute", kind="struct", size=80, text="attribute",
                     fields=[("idMapType", "SRStatIdMappingType", 0, "idMapType"),
                             ("type", "SRStatParamType", 4, "type"),
                             ("name", "StatsRegistry_String64", 8, "name"),
                             ("allowWildCard", "KEL_DEC_U64", 72, "allowWildCard")])
    out[1046] = dict(name="StatsRegistry_Attributes", kind="array", size=160,
                     elem="StatsRegistry_Attribute")
    meta = [("name", "StatsRegistry_String64", 0), ("objectType", "SRStatObjectType", 64),
            ("transformType", "SRStatTransformType", 68), ("valueType", "SRStatValueType", 72),
            ("unit", "SRStatUnit", 76), ("rollupType", "SRStatRollupType", 80),
            ("statOptions", "KEL_DEC_U64", 84), ("label", "StatsRegistry_String64", 92),
            ("description", "StatsRegistry_String128", 156),
            ("localization", "StatsRegistry_String128", 284),
            ("attributes", "StatsRegistry_Attributes", 412)]
    out[1047] = dict(name="StatsRegistry_Metadata", kind="struct", size=572, text="metadata",
                     fields=[(n, t, o, n) for n, t, o in meta])
    assert sorted(out) == list(range(984, 1048))
    return out
