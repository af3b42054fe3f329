// Stat values in the Prometheus text exposition format.
//
// Each stat becomes a gauge named "tarnstats_" + its name in snake case + the suffix of its
// unit's base unit; values are converted to that unit:
//   percent -> _ratio (value / 100; a trailing "pct" word of the name is dropped),
//   kiloBytes, megaBytes -> _bytes (x 1024, x 1048576), megaHertz -> _hertz (x 1000000),
//   microsecond, millisecond, second -> _seconds (x 0.000001, x 0.001, x 1),
//   kiloBytesPerSecond, megaBytesPerSecond -> _bytes_per_second (x 1024, x 1048576),
//   watt -> _watts, joule -> _joules, number -> no suffix.
// The word "sec" of a name is written "second". Stats that share a name (and so a metric name)
// across object types form one metric family; the label "object_type" tells them apart, and
// each attribute level adds a label named after the attribute in snake case. HELP is the
// description, or, when the family's stats describe themselves differently, each object type's
// description after its name. Repeated samples (same metric and labels) are written once.
//
// Guarantees: the output passes `promtool check metrics` without a finding: families are
// contiguous with one HELP and one TYPE line each, names and labels are snake case, and units are
// base units written out in full. Conversions are exact for every 64-bit value (decimal scaling
// in integer arithmetic; a product beyond 64 bits is written in floating point).
#pragma once

#include <cstdint>
#include <map>
#include <ostream>
#include <string>
#include <vector>

#include "tools/Catalogue.h"

namespace Tool {

// "storageAdapter.outstandingIOs" -> "storage_adapter_outstanding_ios", "vNic PortID" ->
// "vnic_port_id": words split at non-alphanumerics, at a lower-to-upper change (not after a lone
// leading lower-case letter, as in "vNic") and before the last capital of a capital run followed
// by lower case (not before a plural "s", as in "IOs").
std::string SnakeCase(const std::string& text);
// A valid label name: SnakeCase, with a leading '_' added before a digit and "_" for an empty name.
std::string LabelName(const std::string& attributeName);
// See above. REQUIRES: `unit` is an SRStatUnit code; unknown codes get no suffix and no conversion.
std::string MetricName(const std::string& statName, int32_t unit);
std::string BaseUnitValue(int64_t value, int32_t unit);

class PrometheusWriter {
public:
    explicit PrometheusWriter(const Catalogue& catalogue) : catalogue_(catalogue) {}
    // REQUIRES: `instances` has one text per attribute level of the stat.
    void Add(long statId, const std::vector<std::string>& instances, int64_t value);
    void Print(std::ostream& out) const;

private:
    struct Family {
        std::string name;
        std::vector<long> stats;           // in order of first sample
        std::vector<std::string> samples;  // "{labels} value" lines without the name
        std::map<std::string, bool> seen;  // label texts already written
    };
    std::string Help(const Family& family) const;

    const Catalogue& catalogue_;
    std::vector<Family> families_;
};

}  // namespace Tool
