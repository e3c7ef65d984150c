#include "command/shown_table.h"

#include "support/shown_width.h"

#include <algorithm>
#include <limits>
#include <string_view>

namespace ingester {

namespace {

constexpr std::size_t Any_Width = std::numeric_limits<std::size_t>::max();
constexpr std::size_t Gap = 2;

std::size_t Widest(const Shown_Column& column)
{
    std::size_t widest = Shown_Width(column.title);
    for (const std::string& cell : column.cells)
        widest = std::max(widest, Shown_Width(cell));
    return widest;
}

/// The places that each column gets; fewer than there are where a line is full.
std::vector<std::size_t> Widths_Of(const std::vector<Shown_Column>& columns, std::size_t width)
{
    constexpr std::size_t most = 40;
    constexpr std::size_t least = 6;  // of a column that is cut
    std::vector<std::size_t> widths;
    std::size_t left = width == 0 ? Any_Width : width;
    for (const Shown_Column& column : columns) {
        const bool last = &column == &columns.back();
        const std::size_t wanted = Widest(column);
        const std::size_t given = std::min({wanted, left, width == 0 || last ? Any_Width : most});
        if (!widths.empty() && given < std::min(wanted, least))
            break;
        widths.push_back(given);
        left -= std::min(left, given + Gap);
    }
    return widths;
}

void Put_Cell(std::string& line, const Shown_Column& column, const std::string& cell, std::size_t width)
{
    const std::string fitted = Fit_To_Width(cell, width);
    const std::string blanks(width - std::min(width, Shown_Width(fitted)), ' ');
    line.append(column.right ? blanks + fitted : fitted + blanks).append(Gap, ' ');
}

void End_Line(std::string& lines)
{
    lines.resize(lines.find_last_not_of(' ') + 1);
    lines += '\n';
}

std::string On_One_Line(std::string_view text)
{
    return Fit_To_Width(text, Any_Width);
}

/// Calls `put` for the titles of the columns, and then for each of their rows.
template <class Put> void For_Each_Line(const std::vector<Shown_Column>& columns, Put put)
{
    put([](const Shown_Column& column) -> const std::string& { return column.title; });
    const std::size_t rows = columns.empty() ? 0 : columns.front().cells.size();
    for (std::size_t row = 0; row < rows; ++row)
        put([row](const Shown_Column& column) -> const std::string& { return column.cells[row]; });
}

}  // namespace

std::string Aligned_Lines(const std::vector<Shown_Column>& columns, std::size_t width, std::size_t& shown)
{
    const std::vector<std::size_t> widths = Widths_Of(columns, width);
    std::string lines;
    For_Each_Line(columns, [&](auto cell_of) {
        for (std::size_t i = 0; i < widths.size(); ++i)
            Put_Cell(lines, columns[i], cell_of(columns[i]), widths[i]);
        End_Line(lines);
    });
    shown = widths.size();
    return lines;
}

std::string Tabbed_Lines(const std::vector<Shown_Column>& columns)
{
    std::string lines;
    For_Each_Line(columns, [&](auto cell_of) {
        for (const Shown_Column& column : columns)
            lines.append(&column == &columns.front() ? "" : "\t").append(On_One_Line(cell_of(column)));
        lines += '\n';
    });
    return lines;
}

}  // namespace ingester
