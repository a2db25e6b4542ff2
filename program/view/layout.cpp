#include "program/view/layout.h"

#include "libvelmora/text/text.h"

#include <fmt/format.h>

#include <algorithm>
#include <sstream>

namespace velmora::cli {

namespace {

std::vector<std::size_t> columnWidths(std::vector<std::vector<Cell>> const& rows)
{
    std::vector<std::size_t> widths;
    for (std::vector<Cell> const& row : rows) {
        if (row.size() == 1) {
            continue;
        }
        widths.resize(std::max(widths.size(), row.size()));
        for (std::size_t i = 0; i < row.size(); ++i) {
            widths[i] = std::max(widths[i], displayWidth(row[i].text));
        }
    }
    return widths;
}

// Nothing is drawn behind the last text of a line.
std::size_t lengthOf(std::vector<Cell> const& row)
{
    std::size_t length = row.size();
    while (length > 0 && row[length - 1].text.empty()) {
        --length;
    }
    return length;
}

} // namespace

std::string labelledLine(std::string const& label, std::string const& value)
{
    return fmt::format("  {:<14} {}\n", label, value.empty() ? "-" : value);
}

std::string drawColumns(std::vector<std::vector<Cell>> const& rows, std::string const& indent, Style const& style)
{
    std::vector<std::size_t> const widths = columnWidths(rows);
    std::string text;
    for (std::vector<Cell> const& row : rows) {
        std::size_t const length = lengthOf(row);
        text += indent;
        if (row.size() == 1) {
            text += style.paint(row[0].mark, row[0].text) + "\n";
            continue;
        }
        for (std::size_t i = 0; i < length; ++i) {
            std::string const blanks(widths[i] - displayWidth(row[i].text), ' ');
            std::string const painted = style.paint(row[i].mark, row[i].text);
            text += i == 0 ? "" : "  ";
            text += row[i].rightAligned ? blanks + painted : i + 1 == length ? painted : painted + blanks;
        }
        text += "\n";
    }
    return text;
}

std::string wrapped(std::string const& text, std::size_t width, std::string const& indent)
{
    std::istringstream words(text);
    std::string lines;
    std::string line;
    for (std::string word; words >> word;) {
        if (!line.empty() && displayWidth(line) + 1 + displayWidth(word) > width) {
            lines += indent + line + "\n";
            line.clear();
        }
        line += (line.empty() ? "" : " ") + word;
    }
    return line.empty() ? lines : lines + indent + line + "\n";
}

std::string counted(std::size_t count, std::string const& noun)
{
    return fmt::format("{} {}{}", count, noun, count == 1 ? "" : "s");
}

} // namespace velmora::cli
