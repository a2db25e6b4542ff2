#include "libvelmora/report/document/document.h"

#include <fmt/format.h>

#include <string_view>

namespace velmora {

namespace {

// Text that no reader of Markdown takes for marks, for HTML or for the border of a cell.
std::string escapedText(std::string const& text)
{
    constexpr std::string_view marks = "\\`*_{}[]<>()#+!|~&";
    std::string result;
    for (char const each : text) {
        if (static_cast<unsigned char>(each) < ' ') {
            result += ' ';
            continue;
        }
        if (marks.find(each) != std::string_view::npos) {
            result += '\\';
        }
        result += each;
    }
    return result;
}

std::string cellText(DocumentCell const& cell)
{
    std::string const text = cell.text.empty() ? "-" : escapedText(cell.text);
    std::string const marked = cell.mark == DocumentMark::Bad ? "**" + text + "**" : text;
    return cell.link.empty() ? marked : "[" + marked + "](#" + cell.link + ")";
}

// Readers of Markdown make no anchor that is the same everywhere, so each section has one of ours before its heading.
std::string anchorLine(DocumentSection const& section)
{
    return section.anchor.empty() ? "" : "<a id=\"" + section.anchor + "\"></a>\n\n";
}

struct MarkdownBlock
{
    std::string operator()(DocumentParagraph const& paragraph) const { return cellText(paragraph.text) + "\n\n"; }

    std::string operator()(DocumentFacts const& facts) const
    {
        std::string text = "| | |\n|---|---|\n";
        for (auto const& [label, cell] : facts.rows) {
            text += "| " + escapedText(label) + " | " + cellText(cell) + " |\n";
        }
        return text + "\n";
    }

    std::string operator()(DocumentTable const& table) const
    {
        std::string text = "|";
        std::string line = "|";
        for (DocumentCell const& head : table.heads) {
            text += " " + escapedText(head.text) + " |";
            line += head.isNumber ? "---:|" : "---|";
        }
        text += "\n" + line + "\n";
        for (std::vector<DocumentCell> const& row : table.rows) {
            text += "|";
            for (DocumentCell const& cell : row) {
                text += " " + cellText(cell) + " |";
            }
            text += "\n";
        }
        return text + "\n";
    }

    std::string operator()(DocumentTiles const& tiles) const
    {
        DocumentFacts facts;
        facts.rows = tiles.tiles;
        return (*this)(facts);
    }

    std::string operator()(DocumentNote const& note) const
    {
        std::string text = "**" + escapedText(note.word.text) + ": " + escapedText(note.title) + "**\n\n" +
                           escapedText(note.text) + "\n\n";
        for (auto const& [label, cells] : note.lists) {
            text += escapedText(label) + ":\n\n";
            for (DocumentCell const& cell : cells) {
                text += "- " + cellText(cell) + "\n";
            }
            text += "\n";
        }
        return text;
    }
};

} // namespace

std::string toMarkdown(ReportDocument const& document)
{
    std::string text = "# " + escapedText(document.title) + "\n\n";
    for (DocumentSection const& section : document.sections) {
        text += anchorLine(section) + std::string(static_cast<std::size_t>(section.level) + 1, '#') + " " +
                escapedText(section.title) + "\n\n";
        for (DocumentBlock const& block : section.blocks) {
            text += std::visit(MarkdownBlock{}, block);
        }
    }
    return text + "---\n\n" + escapedText(document.footer) + "\n";
}

} // namespace velmora
