#include "libvelmora/report/document.h"
#include "libvelmora/report/htmlstyle.h"

#include <fmt/format.h>

#include <algorithm>

namespace velmora {

namespace {

std::string escaped(std::string const& text)
{
    std::string result;
    for (char const each : text) {
        switch (each) {
        case '&':
            result += "&amp;";
            break;
        case '<':
            result += "&lt;";
            break;
        case '>':
            result += "&gt;";
            break;
        case '"':
            result += "&quot;";
            break;
        default:
            result += each;
        }
    }
    return result;
}

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

// The part of the bar, 0 to 1, at which a number stands: the limits are at a fifth and four fifths, so that what lies
// outside is seen outside. With one limit the bar begins or ends at 0.
struct BarScale
{
    double low;
    double high;

    explicit BarScale(LimitBar const& bar)
    {
        double const min = bar.min.value_or(std::min(0.0, *bar.max));
        double const max = bar.max.value_or(std::max(0.0, *bar.min));
        double const span = max > min ? max - min : 1.0;
        low = min - (bar.min ? span / 3.0 : 0.0);
        high = max + (bar.max ? span / 3.0 : span);
    }

    double place(double number) const { return std::clamp((number - low) / (high - low), 0.0, 1.0) * 100.0; }
};

std::string barOf(LimitBar const& bar)
{
    if (!bar.min && !bar.max) {
        return {};
    }
    BarScale const scale(bar);
    double const from = bar.min ? scale.place(*bar.min) : 0.0;
    double const to = bar.max ? scale.place(*bar.max) : 100.0;
    return fmt::format("<svg class=\"bar\" viewBox=\"0 0 100 10\" width=\"100\" height=\"10\" aria-hidden=\"true\">"
                       "<rect x=\"0.5\" y=\"3\" width=\"99\" height=\"4\" class=\"outside\"/>"
                       "<rect x=\"{:.1f}\" y=\"3\" width=\"{:.1f}\" height=\"4\" class=\"inside\"/>"
                       "<rect x=\"{:.1f}\" y=\"0\" width=\"2\" height=\"10\" class=\"value\"/></svg>",
                       from, std::max(to - from, 0.5), std::clamp(scale.place(bar.value) - 1.0, 0.0, 98.0));
}

std::string content(DocumentCell const& cell)
{
    std::string const text = cell.text.empty() ? "-" : escaped(cell.text);
    return cell.bar ? text + " " + barOf(*cell.bar) : text;
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
            rows += fmt::format("<tr><th scope=\"row\">{}</th><td{}>{}</td></tr>\n", escaped(label), classes(cell),
                                content(cell));
        }
        return "<table class=\"facts\">\n<tbody>\n" + rows + "</tbody>\n</table>\n";
    }

    std::string operator()(DocumentTable const& table) const
    {
        std::string html = "<table>\n<thead>\n<tr>";
        for (DocumentCell const& head : table.heads) {
            html += fmt::format("<th scope=\"col\"{}>{}</th>", classes(head), escaped(head.text));
        }
        html += "</tr>\n</thead>\n<tbody>\n";
        for (std::vector<DocumentCell> const& row : table.rows) {
            html += "<tr>";
            for (DocumentCell const& cell : row) {
                html += fmt::format("<td{}>{}</td>", classes(cell), content(cell));
            }
            html += "</tr>\n";
        }
        return html + "</tbody>\n</table>\n";
    }
};

std::string sectionOf(DocumentSection const& section)
{
    int const level = std::clamp(section.level + 1, 2, 6);
    std::string html = fmt::format("<section>\n<h{0}>{1}</h{0}>\n", level, escaped(section.title));
    for (DocumentBlock const& block : section.blocks) {
        html += std::visit(HtmlBlock{}, block);
    }
    return html + "</section>\n";
}

} // namespace

std::string toHtml(ReportDocument const& document)
{
    std::string html = fmt::format(
        "<!DOCTYPE html>\n<html lang=\"en\">\n<head>\n<meta charset=\"utf-8\">\n"
        "<meta http-equiv=\"Content-Security-Policy\" content=\"default-src 'none'; style-src 'unsafe-inline'\">\n"
        "<meta name=\"viewport\" content=\"width=device-width, initial-scale=1\">\n"
        "<title>{0}</title>\n<style>\n{1}</style>\n</head>\n<body>\n<main>\n<h1>{0}</h1>\n",
        escaped(document.title), htmlStyle);
    for (DocumentSection const& section : document.sections) {
        html += sectionOf(section);
    }
    return html + "</main>\n<footer><p>" + escaped(document.footer) + "</p></footer>\n</body>\n</html>\n";
}

} // namespace velmora
