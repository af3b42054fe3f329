"""Word lists for the placeholder rows written by make_definitions.py."""

# Type modules in index order: (key, type-name prefix, element-name prefix, nouns,
#                               (scalars, enums, arrays, structs)).
TYPE_MODULES = [
    ("net", "NetKel_", "NET", "Port Portset Uplink Hostnic Vnic Pnic Team Vlan Lacp Filter Queue "
     "Ring Tso Lro Rss Coalesce Tcpip Arp Route Igmp Mld Netstack Dvs Dvport Beacon Cdp Lldp "
     "Pktcap Shaper Mirror Ipfix Overlay Firewall Dhcp Dns Mac Intr Tx Rx Napi Poll Buffer Heap "
     "Packet Frame Link Driver Offload Sriov Multicast Qos Health", (16, 28, 69, 117)),
    ("mem", "MemKel_", "MEM", "Node Page Heap Pool Zone Swap Compress Share Balloon Reclaim Tier "
     "Numa Lpage Kmem Xmap Slab Client Sched Overcommit", (4, 7, 14, 25)),
    ("rpc", "RpcKel_", "RPC", "Conn Msg", (0, 0, 1, 3)),
    ("vm", "VmKel_", "VM", "Vmx Config Monitor Checkpoint", (1, 2, 3, 6)),
    ("world", "WorldKel_", "WORLD", "World Group Cartel Thread Exit Stack Signal", (2, 4, 8, 16)),
    ("config", "ConfigKel_", "CONFIG", "Option Value", (0, 1, 1, 2)),
    ("rel", "RelKel_", "REL", "Heartbeat Mce Nmi Panic Dump Watchdog Ecc Pcie Fault Log Retry "
     "Health Sensor Lockup", (3, 7, 14, 26)),
    ("hw", "HwKel_", "HW", "Cpu Core Package Pci Device Bar Numa Smbios Acpi Iommu Usb Gpu Clock "
     "Firmware Bios", (4, 7, 14, 25)),
    ("sched", "SchedKel_", "SCHED", "Pcpu Vcpu World Group Cell Queue Alloc Share Limit Resv "
     "Latency Htsharing Affinity Migration Idle Halt Wakeup Coschedule Ready Run Wait Tick "
     "Quantum Load Balance Power Numa Llc", (8, 17, 39, 66)),
    ("uw", "UwKel_", "UW", "Cartel Thread Fd File Socket Pipe Mmap Heap Signal Syscall Process "
     "Linux Mem Pager Timer Poll Futex Proc Core Exec Krn", (8, 16, 39, 67)),
    ("vscsi", "VSCSIKel_", "VSCSI", "Dev Handle Cmd Queue Filter Io Reset Abort Throttle Latency "
     "Sched Share Cap Path", (4, 8, 17, 31)),
    ("wg", "WorldGroupKel_", "WG", "Group Member Mem Cpu", (1, 1, 3, 5)),
    ("sys", "SysKel_", "SYS", "Boot Module Symbol Heap Log Uptime Version Clock Lock Intr Bh "
     "Timer Dump Cpu Mpn Numa Feature Config Modload Service Event Chunk Alarm", (7, 10, 22, 41)),
    ("scsi", "ScsiKel_", "SCSI", "Adapter Path Device Lun Target Plugin Claim Queue Cmd Io "
     "Partition Vaai Reserve Sense Inquiry Cache Nmp Vol Fs Datastore", (5, 8, 18, 31)),
    ("timer", "TimerKel_", "TIMER", "Timer Wheel", (1, 1, 1, 3)),
    ("perf", "PerfKel_", "PERF", "Counter Event Sample Profile Pmc Trace", (2, 3, 5, 10)),
    ("power", "PowerKel_", "POWER", "Pstate Cstate Policy Meter", (1, 2, 3, 4)),
    ("worldlet", "WorldletKel_", "WORLDLET", "Worldlet Queue", (1, 1, 1, 3)),
    ("access", "AccessKel_", "ACCESS", "Domain Rule Label", (1, 1, 1, 3)),
    ("killswitch", "KillswitchKel_", "KILLSWITCH", "Switch", (0, 1, 1, 2)),
    ("tpm", "TpmKel_", "TPM", "Pcr Event Log Key", (1, 2, 3, 7)),
]

SCALAR_SUFFIXES = [
    ("ID", 4, "%u"), ("Handle", 8, "%Lu"), ("Count", 8, "%Lu"), ("Bytes", 8, "%Lu bytes"),
    ("Usec", 8, "%Lu usec"), ("Msec", 4, "%u ms"), ("Percent", 4, "%u%%"), ("Mask", 8, "0x%Lx"),
    ("Addr", 8, "0x%Lx"), ("Pages", 4, "%u pages"), ("Cycles", 8, "%Lu cycles"),
    ("Mhz", 4, "%u MHz"), ("Watts", 4, "%u W"), ("Celsius", 2, "%d C"), ("Prio", 1, "%u"),
    ("Version", 4, "0x%08x"), ("Index", 2, "%u"), ("Weight", 2, "%u"), ("Seq", 8, "%Lu"),
    ("Gen", 4, "%u"),
]

ENUM_SUFFIXES = {
    "State": "UNKNOWN INIT UP DOWN ACTIVE STANDBY FAILED QUIESCED DRAINING OFFLINE",
    "Type": "NONE PHYSICAL VIRTUAL LOGICAL LOOPBACK TUNNEL BRIDGE OVERLAY",
    "Mode": "DISABLED AUTO MANUAL PASSIVE ACTIVE STRICT RELAXED",
    "Policy": "DEFAULT ROUND_ROBIN FAILOVER LOAD_BASED FIXED MOST_RECENT BALANCED",
    "Class": "BEST_EFFORT BACKGROUND NORMAL HIGH CRITICAL REALTIME",
    "Level": "NONE LOW MEDIUM HIGH MAX",
    "Reason": "NONE TIMEOUT ABORT RESET NO_MEMORY BUSY INVALID RETRY",
    "Event": "CREATE DESTROY CONNECT DISCONNECT LINK_UP LINK_DOWN",
    "Status": "OK FAILURE BUSY NOT_FOUND TIMEOUT NO_RESOURCES INVALID_ARG NOT_SUPPORTED",
}
FLAG_WORDS = "ENABLED ACTIVE PRIMARY LOCKED DIRTY SHARED PINNED REMOTE OFFLOAD CAPABLE VALID " \
             "PENDING".split()

STRUCT_SUFFIXES = "Stats Info Config Params State Counters Summary Entry Result Desc Limits Caps " \
                  "Attrs Usage Totals Snapshot Record".split()
COUNTER_SUFFIXES = {"Stats", "Counters", "Summary", "Usage", "Totals", "Snapshot"}
CONFIG_SUFFIXES = {"Config", "Params", "Limits", "Caps"}

COUNTER_MEMBERS = """numPackets numBytes rxPackets txPackets rxBytes txBytes drops errors retries
timeouts allocs frees hits misses waits wakeups usedTime readyTime maxLatency avgLatency
minLatency totalTime samples overflows underflows reads writes readBytes writeBytes commands
aborts resets busyTime idleTime faults evictions inserts lookups failures requests completions
queued inFlight peak current lastValue total""".split()
INFO_MEMBERS = """id name type state flags index owner generation version parentId numEntries
numActive created lastUpdate refCount capacity used free address length""".split()
CONFIG_MEMBERS = """enabled min max shares limit reservation timeout mode policy threshold
interval maxEntries minEntries weight priority burstSize rate period""".split()
DESCRIPTIONS = {
    "numPackets": "number of packets", "numBytes": "number of bytes", "drops": "dropped",
    "errors": "error count", "retries": "retry count", "usedTime": "used time",
    "readyTime": "ready time", "maxLatency": "max latency", "avgLatency": "average latency",
    "totalTime": "total time", "numEntries": "number of entries", "refCount": "reference count",
    "maxEntries": "max entries", "inFlight": "in flight", "lastUpdate": "last update time",
}

# Node modules: root child -> (type modules to draw from, plain branch names, integer-keyed
# collection names, string-keyed collection names, leaf names with their type class).
# Type classes: s structure, e enumeration, sc module scalar, arr module array, str string
# array, u32/u64/bool basic scalars, hist generic histogram.
GENERIC_LEAVES = "stats:s info:s config:s state:e summary:s counters:s usage:s limits:s " \
                 "settings:s health:s mode:e policy:e flags:e enabled:bool count:u32 " \
                 "capabilities:s params:s version:u32 generation:u64 latency:hist totals:s " \
                 "snapshot:s attrs:s debug:s trace:s events:s history:s errorStats:s " \
                 "warnings:u64 timestamps:s owner:sc handle:sc priority:u32 weight:u32 " \
                 "threshold:u32 interval:u32 timeout:u32 maxEntries:u32 numEntries:u32 " \
                 "size:u64 capacity:u64 used:u64 free:u64 peak:u64 average:u64 rate:u64 " \
                 "resetStats:s lastError:e lastChange:u64 description:str label:str " \
                 "properties:s features:s options:s counts:s totalsByType:arr"

NODE_MODULES = {
    "net": (["net"],
            "tcpip teaming lacp filters pktcapture coalescing offload rss lro tso shaping "
            "mirroring ipfix overlay firewall dhcp dns arp routes igmp mld beacon cdp lldp heap "
            "buffers intr napi poll health security vlan multicast qos sriov uplinkHealth",
            "ports queues rings vlans hostnics rxQueues txQueues cpus interfaces entries sessions "
            "pools slots",
            "portsets uplinks pnics dvswitches netstacks drivers teams lags overlays instances",
            "mtu:u32 macAddress:arr linkSpeed:u32 linkState:e duplex:e clientName:str portId:sc "
            "numPorts:u32 numActive:u32 teamPolicy:e vlanId:u32 txStats:s rxStats:s errors:s "
            "drops:u64 queueStats:s ringSize:u32 coalesceParams:s offloadCaps:s rssConfig:s "
            "lroStats:s tsoStats:s driverInfo:s firmware:str pciAddress:str uptime:u64 "
            "resetCount:u64 heapStats:s bufferStats:s intrStats:s pollStats:s mirrorConfig:s "
            "shaperConfig:s filterStats:s routeTable:s arpCache:s"),
    "memory": (["mem"], "numa compression sharing swap balloon reclaim tiers heaps kmem",
               "nodes zones tiers pools", "clients heaps",
               "freePages:u64 totalPages:u64 reservedPages:u64 pageStats:s sharingStats:s "
               "swapStats:s compressStats:s balloonStats:s zoneInfo:s minFree:u32 "
               "overcommit:s tierUsage:s largePages:s"),
    "rpcStats": (["rpc"], "", "", "", ""),
    "vm": (["vm"], "vmx checkpoint", "vms", "configs", "vmxInfo:s monitorStats:s cptState:e"),
    "world": (["world"], "exits stacks signals", "worlds threads", "cartels",
              "worldInfo:s exitStats:s stackUsage:s signalState:e worldName:str groupId:sc"),
    "worldGroups": (["wg", "vscsi"], "mem cpu members", "children", "names",
                    "groupInfo:s memStats:s cpuStats:s memberCount:u32"),
    "config": (["config"], "", "", "", "optionValue:s optionInfo:s"),
    "reliability": (["rel"], "heartbeat mce nmi panic dump watchdog ecc pcie logs lockups "
                    "sensors", "banks cpus sensors entries", "sources logs devices",
                    "beatCount:u64 lastBeat:u64 mceStats:s eccErrors:u64 panicInfo:s "
                    "dumpConfig:s watchdogState:e lockupStats:s sensorReading:sc"),
    "hardware": (["hw"], "cpu pci numa smbios acpi iommu usb gpu clock firmware bios",
                 "cpus cores packages nodes devices buses", "slots vendors",
                 "cpuInfo:s coreInfo:s pciInfo:s barInfo:s numaInfo:s smbiosInfo:s "
                 "acpiTables:s iommuState:e clockMhz:sc firmwareVersion:str biosInfo:s"),
    "sched": (["sched"], "cpu htsharing affinity migration idle halt wakeup coschedule ready "
              "run wait tick quantum load balance power numa llc cells",
              "pcpus vcpus worlds groups cells queues nodes", "policies classes",
              "pcpuStats:s vcpuStats:s readyTime:u64 runTime:u64 waitTime:u64 idleTime:u64 "
              "shares:u32 limit:u64 reservation:u64 affinity:arr migrations:u64 "
              "wakeupStats:s quantum:sc loadStats:s balanceStats:s coschedState:e "
              "htsharing:e groupInfo:s allocInfo:s"),
    "userworld": (["uw"], "fds sockets pipes mmaps heaps signals syscalls linux mem pager "
                  "timers poll futex proc cores exec",
                  "cartels threads fds pids sockets mappings", "names programs",
                  "cartelInfo:s threadInfo:s fdInfo:s fileName:str socketStats:s pipeStats:s "
                  "mmapInfo:s heapStats:s signalMask:e syscallStats:s memStats:s pagerStats:s "
                  "timerInfo:s futexStats:s coreDump:s"),
    "system": (["sys"], "boot modules symbols heap log uptime version clock locks intr bh "
               "timers dump cpu mpn numa features config services events chunks alarms",
               "cpus vectors entries chunks", "modules heaps services features",
               "bootInfo:s moduleInfo:s symbolCount:u32 heapStats:s logLevel:e uptime:u64 "
               "buildVersion:str clockInfo:s lockStats:s intrStats:s bhStats:s dumpConfig:s "
               "mpnStats:s featureState:e serviceState:e eventLog:s alarmInfo:s"),
    "storage": (["scsi", "vscsi"], "adapters paths devices luns targets plugins claim queues "
                "partitions vaai reservations sense cache nmp volumes filesystems datastores",
                "targets luns queues partitions handles", "adapters paths devices plugins "
                "volumes datastores",
                "adapterInfo:s pathInfo:s pathState:e deviceInfo:s lunInfo:s targetInfo:s "
                "queueDepth:u32 ioStats:s cmdStats:s partitionInfo:s vaaiStats:s "
                "reservation:s senseData:s inquiry:s cacheStats:s nmpPolicy:e volumeInfo:s "
                "handle:sc latency:hist"),
    "timer": (["timer"], "", "", "", "timerStats:s wheelInfo:s resolution:u32"),
    "perf": (["perf"], "counters events samples profiles pmc trace", "counters cpus",
             "events profiles", "counterValue:u64 eventInfo:s sampleRate:u32 profileState:e "
             "pmcConfig:s traceBuffer:s"),
    "power": (["power"], "pstates cstates policy meter", "cpus states", "policies",
              "pstateInfo:s cstateStats:s powerPolicy:e meterReading:sc"),
    "worldlets": (["worldlet"], "queues", "worldlets queues", "names",
                  "worldletStats:s queueInfo:s"),
    "tarnAccess": (["access"], "domains rules labels", "rules", "domains labels",
                   "domainInfo:s ruleInfo:s labelInfo:s enforcement:e"),
    "killswitches": (["killswitch"], "", "", "", "switchState:s"),
    "tpm": (["tpm"], "", "", "", "pcrValues:s eventLog:s keyInfo:s tpmState:e"),
}
