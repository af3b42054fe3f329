// A plain text table: a header row and rows of cells, printed in aligned columns.
//
// Columns are separated by two blanks; a column marked right-aligned pads on the left. Lines carry
// no trailing blanks. Widths count bytes, which is exact for the ASCII texts of the catalogue.
#pragma once

#include <ostream>
#include <string>
#include <vector>

namespace Tool {

class TextTable {
public:
    explicit TextTable(std::vector<std::string> header) : header_(std::move(header)), right_(header_.size(), false) {}

    void AlignRight(std::size_t column) { right_.at(column) = true; }
    // REQUIRES: `row` has as many cells as the header.
    void Add(std::vector<std::string> row) { rows_.push_back(std::move(row)); }
    bool Empty() const noexcept { return rows_.empty(); }
    void Print(std::ostream& out) const;

private:
    std::vector<std::string> header_;
    std::vector<bool> right_;
    std::vector<std::vector<std::string>> rows_;
};

}  // namespace Tool
