#include "Plinth/PrintFormatter.h"

namespace Plinth {
namespace {
std::atomic<unsigned long> gFormatCount{0};
}

PrintFormatter PrintFormatter::FormatInt(int32_t value) {
    PrintFormatter f([](const PrintFormatter& self, std::string& out) { out += std::to_string(self.value_.i32); });
    f.value_.i32 = value;
    return f;
}

PrintFormatter PrintFormatter::FormatUInt(uint32_t value) {
    PrintFormatter f([](const PrintFormatter& self, std::string& out) { out += std::to_string(self.value_.u32); });
    f.value_.u32 = value;
    return f;
}

PrintFormatter PrintFormatter::FormatULong(uint64_t value) {
    PrintFormatter f([](const PrintFormatter& self, std::string& out) {
        out += std::to_string(static_cast<unsigned long long>(self.value_.u64));
    });
    f.value_.u64 = value;
    return f;
}

PrintFormatter PrintFormatter::FormatSTLString(const std::string& value) {
    PrintFormatter f([](const PrintFormatter& self, std::string& out) { out += *self.value_.str; });
    f.value_.str = &value;
    return f;
}

void PrintFormatter::Append(std::string& out) const {
    gFormatCount.fetch_add(1, std::memory_order_relaxed);
    fn_(*this, out);
}

unsigned long PrintFormatter::FormatCount() noexcept { return gFormatCount.load(std::memory_order_relaxed); }

}  // namespace Plinth
