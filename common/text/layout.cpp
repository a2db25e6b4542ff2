#include "common/text/layout.h"

#include "common/text/text.h"

#include <algorithm>
#include <numeric>
#include <sstream>
#include <string_view>

namespace velmora {

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

constexpr std::size_t narrowest = 20; // columns that text can be folded to

// The words of the text on lines of at most that many characters, where they allow it.
std::vector<std::string> wordLines(std::string const& text, std::size_t width)
{
    std::istringstream words(text);
    std::vector<std::string> lines;
    for (std::string word; words >> word;) {
        if (lines.empty() || displayWidth(lines.back()) + 1 + displayWidth(word) > width) {
            lines.push_back(word);
        } else {
            lines.back() += " " + word;
        }
    }
    return lines;
}

std::vector<std::size_t> longestWords(std::vector<std::vector<Cell>> const& rows, std::size_t columns)
{
    std::vector<std::size_t> widths(columns, 0);
    for (std::vector<Cell> const& row : rows) {
        for (std::size_t i = 0; row.size() != 1 && i < row.size(); ++i) {
            std::vector<std::string> const words = wordLines(row[i].text, 0);
            for (std::string const& word : words) {
                widths[i] = std::max(widths[i], displayWidth(word));
            }
        }
    }
    return widths;
}

// Takes from the widest columns until their sum fits into the room, and no column narrower than its longest word.
// Columns that can't be made to fit stay as they are.
void narrow(std::vector<std::size_t>& widths, std::vector<std::size_t> const& least, std::size_t room)
{
    std::vector<std::size_t> fitting = widths;
    for (std::size_t sum = std::accumulate(widths.begin(), widths.end(), std::size_t{0}); sum > room; --sum) {
        std::size_t widest = fitting.size();
        for (std::size_t i = 0; i < fitting.size(); ++i) {
            if (fitting[i] > least[i] && (widest == fitting.size() || fitting[i] > fitting[widest])) {
                widest = i;
            }
        }
        if (widest == fitting.size()) {
            return;
        }
        --fitting[widest];
    }
    widths = fitting;
}

// A row in as many lines as its cells need. Nothing is drawn behind the last text of a line.
std::string drawRow(std::vector<Cell> const& row, std::vector<std::size_t> const& widths, std::string const& indent,
                    Style const& style)
{
    std::vector<std::vector<std::string>> cells;
    std::size_t height = 1;
    for (std::size_t i = 0; i < row.size(); ++i) {
        bool const fits = displayWidth(row[i].text) <= widths[i];
        cells.push_back(fits ? std::vector<std::string>{row[i].text} : wordLines(row[i].text, widths[i]));
        height = std::max(height, cells.back().size());
    }
    std::string text;
    for (std::size_t line = 0; line < height; ++line) {
        text += indent;
        std::size_t gap = 0;
        for (std::size_t i = 0; i < row.size(); ++i) {
            std::string const part = line < cells[i].size() ? cells[i][line] : std::string();
            std::size_t const used = displayWidth(part);
            std::size_t const blanks = widths[i] > used ? widths[i] - used : 0;
            gap += (i == 0 ? 0 : 2) + (row[i].rightAligned ? blanks : 0);
            if (!part.empty()) {
                text += std::string(gap, ' ') + style.paint(row[i].mark, part);
                gap = 0;
            }
            gap += row[i].rightAligned ? 0 : blanks;
        }
        text += "\n";
    }
    return text;
}

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

// Where the lines that follow begin: below the last column that leaves them room, else two behind the line's own
// indent.
std::size_t hangOf(std::string_view line, std::size_t columns)
{
    std::size_t const indent = std::min(line.find_first_not_of(' '), line.size());
    std::string_view const plain = line.substr(0, line.find('\033'));
    for (std::size_t gap = plain.rfind("  "); gap != std::string_view::npos && gap > indent; --gap) {
        std::size_t const column = displayWidth(line.substr(0, gap + 2));
        bool const ends = gap + 2 < plain.size() && plain.substr(gap, 2) == "  " && plain[gap + 2] != ' ';
        if (ends && column <= columns / 2) {
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
    constexpr std::size_t labelColumns = 14;
    std::string const blanks(labelColumns - std::min(labelColumns, displayWidth(label)), ' ');
    return "  " + label + blanks + " " + (value.empty() ? "-" : value) + "\n";
}

std::string drawColumns(std::vector<std::vector<Cell>> const& rows, std::string const& indent, Style const& style)
{
    std::vector<std::size_t> widths = columnWidths(rows);
    if (style.columns() >= narrowest && !widths.empty()) {
        std::size_t const between = indent.size() + 2 * (widths.size() - 1);
        narrow(widths, longestWords(rows, widths.size()), style.columns() - std::min(style.columns(), between));
    }
    std::string text;
    for (std::vector<Cell> const& row : rows) {
        text += row.size() == 1 ? indent + style.paint(row[0].mark, row[0].text) + "\n"
                                : drawRow(row, widths, indent, style);
    }
    return text;
}

std::string wrapped(std::string const& text, std::size_t width, std::string const& indent, Style const& style)
{
    if (style.columns() >= narrowest) {
        width = std::min(width, style.columns() - std::min(style.columns(), indent.size()));
    }
    std::string lines;
    for (std::string const& line : wordLines(text, width)) {
        lines += indent + line + "\n";
    }
    return lines;
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
    return std::to_string(count) + " " + noun + (count == 1 ? "" : "s");
}

} // namespace velmora
