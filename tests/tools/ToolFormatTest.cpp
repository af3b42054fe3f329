// The tool's output formats: metric names and base units, the exposition writer, tables, scalar
// print formats and record decoding.
#include <gtest/gtest.h>

#include <cstring>
#include <map>
#include <regex>
#include <set>
#include <sstream>

#include "tarnstats/KELStats.h"
#include "tarnstats/StatCatalogue.h"
#include "tools/Catalogue.h"
#include "tools/CodeTexts.h"
#include "tools/Prometheus.h"
#include "tools/RecordDecoder.h"
#include "tools/TextTable.h"

namespace {

Tool::Catalogue MakeCatalogue() {
    Plinth::Ref<StatsRegistry::KELStats> stats;
    StatsRegistry::KELStatsFactory::GetKELStats(stats);
    Plinth::RefVector<StatsRegistry::StatDef> defs;
    stats->GetStatsList(defs);
    return Tool::Catalogue(std::move(defs));
}

TEST(ToolPrometheus, SnakeCaseSplitsTheCatalogueNamesIntoWords) {
    EXPECT_EQ(Tool::SnakeCase("storageAdapter.outstandingIOs"), "storage_adapter_outstanding_ios");
    EXPECT_EQ(Tool::SnakeCase("storageAdapter.OIOsPct"), "storage_adapter_oios_pct");
    EXPECT_EQ(Tool::SnakeCase("disk.scsiReservationCnflctsPct"), "disk_scsi_reservation_cnflcts_pct");
    EXPECT_EQ(Tool::SnakeCase("vNic PortID"), "vnic_port_id");
    EXPECT_EQ(Tool::SnakeCase("pNic hwnic name"), "pnic_hwnic_name");
    EXPECT_EQ(Tool::SnakeCase("VM group ID"), "vm_group_id");
    EXPECT_EQ(Tool::SnakeCase("VM worldID"), "vm_world_id");
    EXPECT_EQ(Tool::SnakeCase("HTTPServer2Go"), "http_server2_go");
    EXPECT_EQ(Tool::SnakeCase("--"), "");
    EXPECT_EQ(Tool::LabelName("lun device name"), "lun_device_name");
    EXPECT_EQ(Tool::LabelName("2nd level"), "_2nd_level");
    EXPECT_EQ(Tool::LabelName("..."), "_");
}

TEST(ToolPrometheus, MetricNamesFollowTheRulesForEveryStat) {
    const std::regex valid("tarnstats_[a-z][a-z0-9]*(_[a-z0-9]+)*");
    const std::map<int32_t, std::string> suffix = {
        {StatsRegistry::SR_UNIT_PERCENT, "_ratio"},         {StatsRegistry::SR_UNIT_KILOBYTE, "_bytes"},
        {StatsRegistry::SR_UNIT_MEGABYTE, "_bytes"},        {StatsRegistry::SR_UNIT_MEGAHERTZ, "_hertz"},
        {StatsRegistry::SR_UNIT_MICROSECOND, "_seconds"},   {StatsRegistry::SR_UNIT_MILLISECOND, "_seconds"},
        {StatsRegistry::SR_UNIT_SECOND, "_seconds"},        {StatsRegistry::SR_UNIT_KILOBYTEPERSECOND, "_bytes_per_second"},
        {StatsRegistry::SR_UNIT_MEGABYTEPERSECOND, "_bytes_per_second"}, {StatsRegistry::SR_UNIT_WATT, "_watts"},
        {StatsRegistry::SR_UNIT_JOULE, "_joules"}};
    std::map<std::string, std::set<std::string>> namesByMetric;
    for (uint32_t id = 0; id < statIdMax; ++id) {
        const auto& m = statMetadataTab[id];
        const std::string metric = Tool::MetricName(m.name, m.unit);
        SCOPED_TRACE(m.name);
        EXPECT_TRUE(std::regex_match(metric, valid)) << metric;
        auto s = suffix.find(m.unit);
        if (s != suffix.end()) {
            ASSERT_GE(metric.size(), s->second.size());
            EXPECT_EQ(metric.substr(metric.size() - s->second.size()), s->second) << metric;
        }
        // No abbreviated unit words are left.
        for (const char* word : {"_sec_", "_pct_", "_kb_", "_mb_", "_ms_"}) {
            EXPECT_EQ((metric + "_").find(word), std::string::npos) << metric;
        }
        namesByMetric[metric].insert(m.name);
    }
    // A metric family is one stat name (the object types become a label): different names never meet.
    for (const auto& [metric, names] : namesByMetric) EXPECT_EQ(names.size(), 1u) << metric;
    EXPECT_EQ(Tool::MetricName("net.throughput.packetsPerSec", StatsRegistry::SR_UNIT_NUMBER),
              "tarnstats_net_throughput_packets_per_second");
    EXPECT_EQ(Tool::MetricName("power.capacity.usagePct", StatsRegistry::SR_UNIT_PERCENT),
              "tarnstats_power_capacity_usage_ratio");
    EXPECT_EQ(Tool::MetricName("a.bytes", StatsRegistry::SR_UNIT_KILOBYTE), "tarnstats_a_bytes");
}

TEST(ToolPrometheus, ValuesAreConvertedExactlyToBaseUnits) {
    using Tool::BaseUnitValue;
    EXPECT_EQ(BaseUnitValue(37, StatsRegistry::SR_UNIT_PERCENT), "0.37");
    EXPECT_EQ(BaseUnitValue(100, StatsRegistry::SR_UNIT_PERCENT), "1");
    EXPECT_EQ(BaseUnitValue(-1, StatsRegistry::SR_UNIT_PERCENT), "-0.01");
    EXPECT_EQ(BaseUnitValue(0, StatsRegistry::SR_UNIT_PERCENT), "0");
    EXPECT_EQ(BaseUnitValue(1500, StatsRegistry::SR_UNIT_MILLISECOND), "1.5");
    EXPECT_EQ(BaseUnitValue(5, StatsRegistry::SR_UNIT_MICROSECOND), "0.000005");
    EXPECT_EQ(BaseUnitValue(INT64_MIN, StatsRegistry::SR_UNIT_MICROSECOND), "-9223372036854.775808");
    EXPECT_EQ(BaseUnitValue(3, StatsRegistry::SR_UNIT_KILOBYTE), "3072");
    EXPECT_EQ(BaseUnitValue(-2, StatsRegistry::SR_UNIT_MEGABYTEPERSECOND), "-2097152");
    EXPECT_EQ(BaseUnitValue(2400, StatsRegistry::SR_UNIT_MEGAHERTZ), "2400000000");
    EXPECT_EQ(BaseUnitValue(INT64_MAX, StatsRegistry::SR_UNIT_NUMBER), "9223372036854775807");
    EXPECT_EQ(BaseUnitValue(412, StatsRegistry::SR_UNIT_WATT), "412");
    // A product beyond 64 bits is written in floating point, which the format accepts.
    EXPECT_DOUBLE_EQ(std::stod(BaseUnitValue(INT64_MAX, StatsRegistry::SR_UNIT_KILOBYTE)), 9223372036854775807.0 * 1024);
    EXPECT_DOUBLE_EQ(std::stod(BaseUnitValue(INT64_MIN, StatsRegistry::SR_UNIT_MEGABYTE)), -9223372036854775808.0 * 1048576);
}

TEST(ToolPrometheus, FamiliesAreContiguousWithOneHelpAndNoRepeatedSample) {
    const Tool::Catalogue catalogue = MakeCatalogue();
    Tool::PrometheusWriter writer(catalogue);
    writer.Add(33, {"moid-1", "7"}, 2);       // net.throughput.usage, vNic
    writer.Add(7, {"10", "d\"0\\"}, 1);     // another family in between
    writer.Add(24, {}, 3);                  // net.throughput.usage, host: back to the first family
    writer.Add(33, {"moid-1", "7"}, 99);      // repeated labels: dropped
    std::ostringstream out;
    writer.Print(out);
    const std::string text = out.str();
    const std::string usage = "tarnstats_net_throughput_usage_bytes_per_second";
    EXPECT_EQ(text,
              "# HELP " + usage + " vNic: " + catalogue.Def(33).description + "; host: " + catalogue.Def(24).description +
                  "\n# TYPE " + usage + " gauge\n" + usage + "{object_type=\"vNic\",vm=\"moid-1\",vnic_port_id=\"7\"} 2048\n" +
                  usage + "{object_type=\"host\"} 3072\n" +
                  "# HELP tarnstats_virtual_disk_throughput_usage_bytes_per_second " + catalogue.Def(7).description +
                  "\n# TYPE tarnstats_virtual_disk_throughput_usage_bytes_per_second gauge\n"
                  "tarnstats_virtual_disk_throughput_usage_bytes_per_second"
                  "{object_type=\"vDisk\",world_id=\"10\",vscsi_handle=\"d\\\"0\\\\\"} 1024\n");
}

TEST(ToolTextTable, ColumnsAlignWithoutTrailingBlanks) {
    Tool::TextTable table({"id", "name", "value"});
    table.AlignRight(0);
    table.AlignRight(2);
    table.Add({"7", "a", "12345"});
    table.Add({"10", "longer name", ""});
    std::ostringstream out;
    table.Print(out);
    EXPECT_EQ(out.str(),
              "id  name         value\n"
              " 7  a            12345\n"
              "10  longer name\n");
}

TEST(ToolRecordDecoder, ScalarsFollowTheirPrintFormat) {
    const uint8_t minus2[8] = {0xfe, 0xff, 0xff, 0xff, 0xff, 0xff, 0xff, 0xff};
    EXPECT_EQ(Tool::FormatScalar("%Ld", 8, minus2), "-2");
    EXPECT_EQ(Tool::FormatScalar("%Lu", 8, minus2), "18446744073709551614");
    EXPECT_EQ(Tool::FormatScalar("%d", 2, minus2), "-2");
    EXPECT_EQ(Tool::FormatScalar("%u", 2, minus2), "65534");
    EXPECT_EQ(Tool::FormatScalar("0x%04x", 2, minus2), "0xfffe");
    EXPECT_EQ(Tool::FormatScalar("0x%02x ", 1, minus2), "0xfe") << "the trailing blank is dropped";
    EXPECT_EQ(Tool::FormatScalar("%#x", 8, minus2), "0xfffffffffffffffe");
    const uint8_t five[4] = {5, 0, 0, 0};
    EXPECT_EQ(Tool::FormatScalar("%Lu KB", 4, five), "5 KB");
    EXPECT_EQ(Tool::FormatScalar("%u%% busy", 4, five), "5% busy");
    EXPECT_EQ(Tool::FormatScalar("plain", 4, five), "plain5");
    const uint8_t letter[1] = {'Q'};
    EXPECT_EQ(Tool::FormatScalar("%c", 1, letter), "Q");
    EXPECT_EQ(Tool::FormatScalar("%u", 3, five), "0x000005") << "odd sizes are shown as bytes";
}

TEST(ToolRecordDecoder, RecordsAreDecodedThroughTheExportedTypes) {
    // A stat set record of two stats, through StatsRegistry_GetStruct2.
    const auto* getStruct = Tool::FindType("StatsRegistry_GetStruct2");
    ASSERT_NE(getStruct, nullptr);
    std::vector<uint8_t> record(getStruct->size, 0);
    ASSERT_EQ(record.size(), 36u);
    const uint32_t count = 2;
    const uint64_t ids[2] = {7, 8};
    const int64_t values[2] = {-3, 41};
    std::memcpy(record.data(), &count, 4);
    for (int i = 0; i < 2; ++i) {
        std::memcpy(record.data() + 4 + 16 * i, &ids[i], 8);
        std::memcpy(record.data() + 12 + 16 * i, &values[i], 8);
    }
    const auto fields = Tool::DecodeRecord(*getStruct, record.data(), record.size(), "ignored");
    EXPECT_EQ(fields, (std::vector<Tool::DecodedField>{{"numStats", "2"},
                                                        {"stats[0].id", "7"},
                                                        {"stats[0].value", "-3"},
                                                        {"stats[1].id", "8"},
                                                        {"stats[1].value", "41"}}));
    // A short buffer: what lies beyond is named, never read.
    const auto cut = Tool::DecodeRecord(*getStruct, record.data(), 20, "");
    ASSERT_EQ(cut.size(), 5u);
    EXPECT_EQ(cut[2].second, "-3");
    EXPECT_EQ(cut[3], (Tool::DecodedField{"stats[1].id", "(beyond the record)"}));

    // A character array is one string, cut at the first NUL, odd bytes escaped.
    const auto* name = Tool::FindType("VSCSIKel_DevName");
    ASSERT_NE(name, nullptr);
    std::vector<uint8_t> text(name->size, 0);
    std::memcpy(text.data(), "d\"1\x01", 4);
    EXPECT_EQ(Tool::DecodeRecord(*name, text.data(), text.size(), "name"),
              (std::vector<Tool::DecodedField>{{"name", "\"d\\\"1\\x01\""}}));
    std::fill(text.begin(), text.end(), 'x');  // no NUL at all: the whole field
    EXPECT_EQ(Tool::DecodeRecord(*name, text.data(), text.size(), "name")[0].second, "\"" + std::string(16, 'x') + "\"");

    // Enumerations by display text; unknown values in decimal.
    const auto* unit = Tool::FindType("SRStatUnit");
    ASSERT_NE(unit, nullptr);
    int32_t code = StatsRegistry::SR_UNIT_KILOBYTEPERSECOND;
    EXPECT_EQ(Tool::DecodeRecord(*unit, reinterpret_cast<const uint8_t*>(&code), 4, "unit")[0].second,
              "kiloBytesPerSecond");
    code = -7;
    EXPECT_EQ(Tool::DecodeRecord(*unit, reinterpret_cast<const uint8_t*>(&code), 4, "unit")[0].second, "-7");
}

TEST(ToolRecordDecoder, FlagSetsJoinTheTextsOfTheirBits) {
    // Any flag set of the schema with two single-bit elements will do.
    for (uint32_t t = 0; t < kelMaxTypeDefs; ++t) {
        const auto& type = kelTypeDefsLookupTab[t];
        if (type.kind != StatsRegistry::KEL_KIND_ENUM || !type.isFlagSet || type.size != 4) continue;
        std::vector<const StatsRegistry::KelEnumElement*> bits;
        for (uintptr_t i = 0; i < type.elemTypeOrCount.count; ++i) {
            const auto& e = type.elemIndexOrTable.elements[i];
            if (e.value > 0 && (e.value & (e.value - 1)) == 0) bits.push_back(&e);
        }
        if (bits.size() < 2) continue;
        const int32_t unknownBit = 0x40000000;
        bool clash = false;
        for (uintptr_t i = 0; i < type.elemTypeOrCount.count; ++i) {
            const int32_t v = type.elemIndexOrTable.elements[i].value;
            clash = clash || (v & unknownBit) != 0 || v == (bits[0]->value | bits[1]->value);
        }
        if (clash) continue;
        const int32_t value = bits[0]->value | bits[1]->value | unknownBit;
        const auto fields = Tool::DecodeRecord(type, reinterpret_cast<const uint8_t*>(&value), 4, "flags");
        ASSERT_EQ(fields.size(), 1u);
        const std::string& text = fields[0].second;
        SCOPED_TRACE(type.name);
        EXPECT_NE(text.find(bits[0]->text), std::string::npos) << text;
        EXPECT_NE(text.find(bits[1]->text), std::string::npos) << text;
        EXPECT_NE(text.find("|0x40000000"), std::string::npos) << text;
        return;
    }
    GTEST_SKIP() << "the schema has no flag set with two single-bit elements";
}

}  // namespace
