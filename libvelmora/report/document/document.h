#pragma once

#include <optional>
#include <string>
#include <utility>
#include <variant>
#include <vector>

// A report as people read it, without a form yet: HTML and Markdown are written from it, so that they can't differ in
// what they tell.

namespace velmora {

// How a text is to be taken; each mark also stands as a word in the text beside it, for paper and for readers who don't
// see colours.
enum class DocumentMark
{
    None,
    Good,
    Warning,
    Bad,
    Faint,
};

// Where a value stands between its limits; a limit that is not there is open.
struct LimitBar
{
    double value;
    std::optional<double> min;
    std::optional<double> max;
};

struct DocumentCell
{
    DocumentCell() = default;
    DocumentCell(std::string shown, DocumentMark meant = DocumentMark::None, bool number = false,
                 std::optional<LimitBar> drawn = std::nullopt)
        : text(std::move(shown)), mark(meant), isNumber(number), bar(drawn)
    {}
    DocumentCell(char const* shown, DocumentMark meant = DocumentMark::None, bool number = false)
        : DocumentCell(std::string(shown), meant, number)
    {}

    std::string text;
    DocumentMark mark = DocumentMark::None;
    bool isNumber = false;       // aligned at the right
    std::optional<LimitBar> bar; // drawn where the form can
    std::string link = {};       // anchor of the section that the text leads to
};

struct DocumentTable
{
    std::vector<DocumentCell> heads;
    std::vector<std::vector<DocumentCell>> rows;
};

// Labels and what belongs to them.
struct DocumentFacts
{
    std::vector<std::pair<std::string, DocumentCell>> rows;
};

struct DocumentParagraph
{
    DocumentCell text;
};

// A few numbers that one sees first.
struct DocumentTiles
{
    std::vector<std::pair<std::string, DocumentCell>> tiles;
};

// One thing worth telling with what speaks for it.
struct DocumentNote
{
    DocumentCell word; // how it is to be taken, with its mark
    std::string title;
    std::string text;
    std::vector<std::pair<std::string, std::vector<DocumentCell>>> lists; // each under its label
};

using DocumentBlock = std::variant<DocumentParagraph, DocumentFacts, DocumentTable, DocumentTiles, DocumentNote>;

struct DocumentSection
{
    int level; // 1 is the highest below the title
    std::string title;
    std::vector<DocumentBlock> blocks;
    std::string anchor = {}; // letters, digits and hyphens; empty for a section that nothing leads to
};

struct ReportDocument
{
    std::string title;
    std::vector<DocumentSection> sections;
    std::string footer;
    std::string contents = {}; // title of a list of the sections of level 1, which is left out without one
};

// One page that needs nothing else: no script, no picture from elsewhere; it prints on A4 and Letter.
std::string toHtml(ReportDocument const& document);

// The same in Markdown as most readers of it understand, tables with pipes included.
std::string toMarkdown(ReportDocument const& document);

} // namespace velmora
