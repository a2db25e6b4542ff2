#include "program/view/layout.h"

#include "libvelmora/text/text.h"

#include <fmt/format.h>

#include <algorithm>
#include <sstream>
#include <string_view>

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

constexpr std::size_t narrowest = 20; // columns that text can be folded to

// The length of a sequence that switches colours, at its start; 0 for anything else.
std::size_t sequenceLength(std::string_view text)
{
    std::size_t const end = text.starts_with("\033[") ? text.find('m') : std::string_view::npos;
    return end != std::string_view::npos ? end + 1 : 0;
}

// How many bytes of the text fill that many columns.
std::size_t bytesOfColumns(std::string_view text, std::size_t columns)
{
    std::size_t at = 0;
    while (at < text.size()) {
        if (std::size_t const sequence = sequenceLength(text.substr(at)); sequence != 0) {
            at += sequence;
            continue;
        }
        std::string_view const plain = text.substr(at, std::max<std::size_t>(text.find('\033', at + 1) - at, 1));
        std::size_t const fits = bytesOfWidth(plain, columns);
        if (fits < plain.size()) {
            return at + fits;
        }
        columns -= displayWidth(plain);
        at += plain.size();
    }
    return at;
}

// Where the lines that follow begin: below the last column, else two behind the line's own indent.
std::size_t hangOf(std::string_view line, std::size_t columns)
{
    std::size_t const indent = std::min(line.find_first_not_of(' '), line.size());
    std::size_t const gap = line.rfind("  ");
    if (gap != std::string_view::npos && gap >= indent) {
        std::size_t const column = displayWidth(line.substr(0, gap + 2));
        if (column <= columns / 2 && line.substr(0, gap).find('\033') == std::string_view::npos) {
            return column;
        }
    }
    bool const listed = line.substr(indent).starts_with("- ");
    return std::min(indent + (indent == 0 || listed ? 2 : 4), columns / 2);
}

std::string foldedLine(std::string_view line, std::size_t columns)
{
    std::string const hang(hangOf(line, columns), ' ');
    std::string text;
    std::size_t room = columns;
    std::size_t fits = bytesOfColumns(line, room);
    while (fits < line.size()) {
        std::size_t const first = std::min(line.find_first_not_of(' '), line.size());
        std::size_t blank = line.rfind(' ', fits);
        if (blank == std::string_view::npos || blank <= first) {
            blank = line.find(' ', fits); // a word that is longer stands whole
        }
        if (blank == std::string_view::npos) {
            break;
        }
        std::size_t const end = line.find_last_not_of(' ', blank);
        text += std::string(line.substr(0, end + 1)) + "\n" + hang;
        line.remove_prefix(std::min(line.find_first_not_of(' ', blank), line.size()));
        room = columns - hang.size();
        fits = bytesOfColumns(line, room);
    }
    return text + std::string(line);
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

std::string folded(std::string const& text, std::size_t columns)
{
    if (columns < narrowest) {
        return text;
    }
    std::string result;
    std::size_t begin = 0;
    while (begin < text.size()) {
        std::size_t const end = std::min(text.find('\n', begin), text.size());
        result += foldedLine(std::string_view(text).substr(begin, end - begin), columns);
        result += end < text.size() ? "\n" : "";
        begin = end + 1;
    }
    return result;
}

std::string counted(std::size_t count, std::string const& noun)
{
    return fmt::format("{} {}{}", count, noun, count == 1 ? "" : "s");
}

} // namespace velmora::cli
