#include "libvelmora/report/document/document.h"
#include "libvelmora/report/document/htmlescape.h"
#include "libvelmora/report/document/htmlstyle.h"
#include "libvelmora/report/document/limitbar.h"

#include <fmt/format.h>

#include <algorithm>

namespace velmora {

namespace {

char const* className(DocumentMark mark)
{
    static constexpr char const* names[] = {"", "good", "warning", "bad", "faint"};
    return names[static_cast<int>(mark)];
}

std::string classes(DocumentCell const& cell)
{
    std::string names = className(cell.mark);
    if (cell.isNumber) {
        names += names.empty() ? "number" : " number";
    }
    return names.empty() ? "" : fmt::format(" class=\"{}\"", names);
}

std::string content(DocumentCell const& cell)
{
    std::string text = cell.text.empty() ? "-" : escapedHtml(cell.text);
    if (cell.mark == DocumentMark::Good || cell.mark == DocumentMark::Warning || cell.mark == DocumentMark::Bad) {
        text = fmt::format("<span class=\"mark\">{}</span>", text);
    }
    if (!cell.link.empty()) {
        text = fmt::format("<a href=\"#{}\">{}</a>", escapedHtml(cell.link), text);
    }
    return cell.bar ? text + " " + drawnBar(*cell.bar) : text;
}

struct HtmlBlock
{
    std::string operator()(DocumentParagraph const& paragraph) const
    {
        return fmt::format("<p{}>{}</p>\n", classes(paragraph.text), content(paragraph.text));
    }

    std::string operator()(DocumentFacts const& facts) const
    {
        std::string rows;
        for (auto const& [label, cell] : facts.rows) {
            rows += fmt::format("<tr><th scope=\"row\">{}</th><td{}>{}</td></tr>\n", escapedHtml(label), classes(cell),
                                content(cell));
        }
        return "<table class=\"facts\">\n<tbody>\n" + rows + "</tbody>\n</table>\n";
    }

    // A row of a wide table becomes a block on a phone, each cell behind the head that it stands under.
    std::string operator()(DocumentTable const& table) const
    {
        constexpr std::size_t manyColumns = 5;
        bool const wide = table.heads.size() >= manyColumns;
        std::string html = wide ? "<table class=\"wide\">\n<thead>\n<tr>" : "<table>\n<thead>\n<tr>";
        for (DocumentCell const& head : table.heads) {
            html += fmt::format("<th scope=\"col\"{}>{}</th>", classes(head), escapedHtml(head.text));
        }
        html += "</tr>\n</thead>\n<tbody>\n";
        for (std::vector<DocumentCell> const& row : table.rows) {
            html += "<tr>";
            for (std::size_t i = 0; i < row.size(); ++i) {
                std::string const head = wide ? headOf(table, i) : std::string();
                html += fmt::format("<td{}{}>{}</td>", classes(row[i]), head, content(row[i]));
            }
            html += "</tr>\n";
        }
        return html + "</tbody>\n</table>\n";
    }

    static std::string headOf(DocumentTable const& table, std::size_t column)
    {
        return column < table.heads.size() ? fmt::format(" data-head=\"{}\"", escapedHtml(table.heads[column].text))
                                           : std::string();
    }

    std::string operator()(DocumentTiles const& tiles) const
    {
        std::string html = "<dl class=\"tiles\">\n";
        for (auto const& [label, cell] : tiles.tiles) {
            html +=
                fmt::format("<div{}><dt>{}</dt><dd>{}</dd></div>\n", classes(cell), escapedHtml(label), content(cell));
        }
        return html + "</dl>\n";
    }

    std::string operator()(DocumentNote const& note) const
    {
        std::string html = fmt::format(
            "<div class=\"note {}\">\n<p class=\"title\"><span class=\"mark\">{}</span> {}</p>\n"
            "<p>{}</p>\n",
            className(note.word.mark), escapedHtml(note.word.text), escapedHtml(note.title), escapedHtml(note.text));
        for (auto const& [label, cells] : note.lists) {
            html += fmt::format("<p class=\"label\">{}</p>\n<ul>\n", escapedHtml(label));
            for (DocumentCell const& cell : cells) {
                html += fmt::format("<li>{}</li>\n", content(cell));
            }
            html += "</ul>\n";
        }
        return html + "</div>\n";
    }
};

std::string sectionOf(DocumentSection const& section)
{
    int const level = std::clamp(section.level + 1, 2, 6);
    std::string const anchor =
        section.anchor.empty() ? std::string() : fmt::format(" id=\"{}\"", escapedHtml(section.anchor));
    std::string html =
        fmt::format("<section class=\"level{0}\"{1}>\n<h{0}>{2}</h{0}>\n", level, anchor, escapedHtml(section.title));
    for (DocumentBlock const& block : section.blocks) {
        html += std::visit(HtmlBlock{}, block);
    }
    return html + "</section>\n";
}

std::string contentsOf(ReportDocument const& document)
{
    if (document.contents.empty()) {
        return {};
    }
    std::string html = fmt::format("<nav aria-label=\"{}\">\n<ul>\n", escapedHtml(document.contents));
    for (DocumentSection const& section : document.sections) {
        if (section.level == 1 && !section.anchor.empty()) {
            html += fmt::format("<li><a href=\"#{}\">{}</a></li>\n", escapedHtml(section.anchor),
                                escapedHtml(section.title));
        }
    }
    return html + "</ul>\n</nav>\n";
}

} // namespace

std::string toHtml(ReportDocument const& document)
{
    std::string html = fmt::format(
        "<!DOCTYPE html>\n<html lang=\"en\">\n<head>\n<meta charset=\"utf-8\">\n"
        "<meta http-equiv=\"Content-Security-Policy\" content=\"default-src 'none'; style-src 'unsafe-inline'\">\n"
        "<meta name=\"viewport\" content=\"width=device-width, initial-scale=1\">\n"
        "<title>{0}</title>\n<style>\n{1}</style>\n</head>\n<body>\n<header>\n<h1>{0}</h1>\n{2}</header>\n<main>\n",
        escapedHtml(document.title), htmlStyle, contentsOf(document));
    for (DocumentSection const& section : document.sections) {
        html += sectionOf(section);
    }
    return html + "</main>\n<footer><p>" + escapedHtml(document.footer) + "</p></footer>\n</body>\n</html>\n";
}

} // namespace velmora
