#include "testing/ConformanceLadder.h"

#include "testing/FailingAllocator.h"

#include <algorithm>
#include <array>
#include <utility>

namespace
{
using Row = std::array<std::string, 3>;

std::string PADDED(std::string const& text, std::size_t width) { return text + std::string(width - text.size(), ' '); }
} // namespace

void ConformanceLadder::add(Column column, std::string text)
{
    FailingAllocator::Pause const unseen;
    m_lines.push_back({column, std::move(text)});
}

std::string ConformanceLadder::getText() const
{
    std::vector<Row> rows = {{"the wire", "the module's leg", "the other side"}};
    for (Line const& line : m_lines)
        rows.emplace_back()[line.column] = line.text;
    std::size_t widths[2] = {};
    for (Row const& row : rows)
        for (unsigned int i = 0; i < 2; ++i)
            widths[i] = std::max(widths[i], row[i].size());
    std::string text;
    for (Row const& row : rows)
        text += "    " + PADDED(row[0], widths[0]) + " | " + PADDED(row[1], widths[1]) + " |" +
                (row[2].empty() ? "" : " ") + row[2] + "\n";
    return text;
}
