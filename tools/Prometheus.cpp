#include "tools/Prometheus.h"

#include <algorithm>
#include <cctype>
#include <cstdio>

#include "tarnstats/StatCatalogue.h"

namespace Tool {
namespace {

bool Lower(char c) { return std::islower(static_cast<unsigned char>(c)) != 0; }
bool Upper(char c) { return std::isupper(static_cast<unsigned char>(c)) != 0; }
bool Digit(char c) { return std::isdigit(static_cast<unsigned char>(c)) != 0; }

std::vector<std::string> Words(const std::string& text) {
    std::vector<std::string> words;
    std::string current;
    auto flush = [&] {
        if (!current.empty()) words.push_back(current);
        current.clear();
    };
    for (std::size_t i = 0; i < text.size(); ++i) {
        const char c = text[i];
        if (!Lower(c) && !Upper(c) && !Digit(c)) {
            flush();
            continue;
        }
        if (Upper(c) && !current.empty()) {
            const char prev = text[i - 1];
            const bool nextLower = i + 1 < text.size() && Lower(text[i + 1]);
            const bool pluralS = nextLower && text[i + 1] == 's' && (i + 2 >= text.size() || !Lower(text[i + 2]));
            const bool loneLeadingLetter = current.size() == 1 && Lower(current[0]);
            if ((Lower(prev) || Digit(prev)) && !loneLeadingLetter) flush();
            else if (Upper(prev) && nextLower && !pluralS) flush();
        }
        current += static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    }
    flush();
    return words;
}

std::string Join(const std::vector<std::string>& words) {
    std::string out;
    for (const auto& w : words) out += (out.empty() ? "" : "_") + w;
    return out;
}

struct UnitRule {
    const char* suffix;   // base unit words, without the leading '_'
    uint64_t multiplier;  // applied first
    unsigned decimals;    // then divided by 10^decimals
};

UnitRule RuleOf(int32_t unit) {
    switch (unit) {
        case StatsRegistry::SR_UNIT_PERCENT: return {"ratio", 1, 2};
        case StatsRegistry::SR_UNIT_KILOBYTE: return {"bytes", 1024, 0};
        case StatsRegistry::SR_UNIT_MEGABYTE: return {"bytes", 1048576, 0};
        case StatsRegistry::SR_UNIT_MEGAHERTZ: return {"hertz", 1000000, 0};
        case StatsRegistry::SR_UNIT_MICROSECOND: return {"seconds", 1, 6};
        case StatsRegistry::SR_UNIT_MILLISECOND: return {"seconds", 1, 3};
        case StatsRegistry::SR_UNIT_SECOND: return {"seconds", 1, 0};
        case StatsRegistry::SR_UNIT_KILOBYTEPERSECOND: return {"bytes_per_second", 1024, 0};
        case StatsRegistry::SR_UNIT_MEGABYTEPERSECOND: return {"bytes_per_second", 1048576, 0};
        case StatsRegistry::SR_UNIT_WATT: return {"watts", 1, 0};
        case StatsRegistry::SR_UNIT_JOULE: return {"joules", 1, 0};
        default: return {"", 1, 0};  // number
    }
}

// |value| as unsigned, exact for the most negative value too.
uint64_t Magnitude(int64_t value) {
    return value < 0 ? static_cast<uint64_t>(0) - static_cast<uint64_t>(value) : static_cast<uint64_t>(value);
}

std::string Escape(const std::string& text, bool quotes) {
    std::string out;
    for (char c : text) {
        if (c == '\\') out += "\\\\";
        else if (c == '\n') out += "\\n";
        else if (c == '"' && quotes) out += "\\\"";
        else out += c;
    }
    return out;
}

}  // namespace

std::string SnakeCase(const std::string& text) { return Join(Words(text)); }

std::string LabelName(const std::string& attributeName) {
    std::string name = SnakeCase(attributeName);
    if (name.empty() || Digit(name[0])) name = "_" + name;
    return name;
}

std::string MetricName(const std::string& statName, int32_t unit) {
    std::vector<std::string> words = Words(statName);
    for (auto& w : words) {
        if (w == "sec") w = "second";
    }
    const UnitRule rule = RuleOf(unit);
    if (unit == StatsRegistry::SR_UNIT_PERCENT && !words.empty() && words.back() == "pct") words.pop_back();
    std::string name = "tarnstats_" + Join(words);
    const std::string suffix = std::string("_") + rule.suffix;
    if (*rule.suffix != '\0' &&
        (name.size() < suffix.size() || name.compare(name.size() - suffix.size(), suffix.size(), suffix) != 0)) {
        name += suffix;
    }
    return name;
}

std::string BaseUnitValue(int64_t value, int32_t unit) {
    const UnitRule rule = RuleOf(unit);
    const bool negative = value < 0;
    uint64_t magnitude = Magnitude(value);
    if (rule.multiplier != 1) {
        uint64_t product = 0;
        if (__builtin_mul_overflow(magnitude, rule.multiplier, &product)) {
            char text[64];
            std::snprintf(text, sizeof text, "%.17g", static_cast<double>(value) * static_cast<double>(rule.multiplier));
            return text;
        }
        magnitude = product;
    }
    std::string digits = std::to_string(magnitude);
    if (rule.decimals > 0) {
        if (digits.size() <= rule.decimals) digits.insert(0, rule.decimals + 1 - digits.size(), '0');
        std::string fraction = digits.substr(digits.size() - rule.decimals);
        digits.erase(digits.size() - rule.decimals);
        fraction.erase(fraction.find_last_not_of('0') + 1);
        if (!fraction.empty()) digits += "." + fraction;
    }
    return (negative && digits != "0" ? "-" : "") + digits;
}

void PrometheusWriter::Add(long statId, const std::vector<std::string>& instances, int64_t value) {
    const auto& def = catalogue_.Def(statId);
    const std::string name = MetricName(def.name, def.unit);
    auto family = std::find_if(families_.begin(), families_.end(), [&](const Family& f) { return f.name == name; });
    if (family == families_.end()) {
        families_.push_back(Family{name, {}, {}, {}});
        family = families_.end() - 1;
    }
    if (std::find(family->stats.begin(), family->stats.end(), statId) == family->stats.end()) {
        family->stats.push_back(statId);
    }
    std::string labels = "object_type=\"" + Escape(catalogue_.ObjectTypeName(statId), true) + "\"";
    std::vector<std::string> used{"object_type"};
    for (std::size_t i = 0; i < def.attributes.size() && i < instances.size(); ++i) {
        std::string label = LabelName(def.attributes[i].name);
        while (std::find(used.begin(), used.end(), label) != used.end()) label += "_";
        used.push_back(label);
        labels += "," + label + "=\"" + Escape(instances[i], true) + "\"";
    }
    if (!family->seen.emplace(labels, true).second) return;
    family->samples.push_back("{" + labels + "} " + BaseUnitValue(value, def.unit));
}

std::string PrometheusWriter::Help(const Family& family) const {
    bool same = true;
    for (long id : family.stats) same = same && catalogue_.Def(id).description == catalogue_.Def(family.stats[0]).description;
    if (same) return catalogue_.Def(family.stats[0]).description;
    std::string help;
    for (long id : family.stats) {
        help += (help.empty() ? "" : "; ") + catalogue_.ObjectTypeName(id) + ": " + catalogue_.Def(id).description;
    }
    return help;
}

void PrometheusWriter::Print(std::ostream& out) const {
    for (const auto& f : families_) {
        out << "# HELP " << f.name << ' ' << Escape(Help(f), false) << '\n';
        out << "# TYPE " << f.name << " gauge\n";
        for (const auto& s : f.samples) out << f.name << s << '\n';
    }
}

}  // namespace Tool
