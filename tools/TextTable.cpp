#include "tools/TextTable.h"

#include <algorithm>

namespace Tool {

void TextTable::Print(std::ostream& out) const {
    std::vector<std::size_t> width(header_.size(), 0);
    auto measure = [&](const std::vector<std::string>& row) {
        for (std::size_t c = 0; c < row.size() && c < width.size(); ++c) width[c] = std::max(width[c], row[c].size());
    };
    measure(header_);
    for (const auto& row : rows_) measure(row);
    auto print = [&](const std::vector<std::string>& row) {
        std::string line;
        for (std::size_t c = 0; c < width.size(); ++c) {
            const std::string& cell = c < row.size() ? row[c] : std::string();
            const std::string pad(width[c] - cell.size(), ' ');
            if (c > 0) line += "  ";
            line += right_[c] ? pad + cell : cell + pad;
        }
        line.erase(line.find_last_not_of(' ') + 1);
        out << line << '\n';
    };
    print(header_);
    for (const auto& row : rows_) print(row);
}

}  // namespace Tool
