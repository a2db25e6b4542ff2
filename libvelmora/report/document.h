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

using DocumentBlock = std::variant<DocumentParagraph, DocumentFacts, DocumentTable>;

struct DocumentSection
{
    int level; // 1 is the highest below the title
    std::string title;
    std::vector<DocumentBlock> blocks;
};

struct ReportDocument
{
    std::string title;
    std::vector<DocumentSection> sections;
    std::string footer;
};

// One page that needs nothing else: no script, no picture from elsewhere; it prints on A4 and Letter.
std::string toHtml(ReportDocument const& document);

// The same in Markdown as most readers of it understand, tables with pipes included.
std::string toMarkdown(ReportDocument const& document);

} // namespace velmora
