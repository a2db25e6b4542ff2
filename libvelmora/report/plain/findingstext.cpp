#include "common/text/layout.h"
#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/report/texts/findingtexts.h"
#include "libvelmora/report/texts/inspectiontexts.h"
#include "libvelmora/report/texts/labels.h"
#include "libvelmora/report/texts/plaintexts.h"

#include <fmt/format.h>

namespace velmora {

namespace {

constexpr std::size_t textColumns = 76;

Mark findingMark(Severity severity)
{
    static constexpr Mark marks[] = {Mark::None, Mark::Warning, Mark::Bad};
    return marks[static_cast<std::size_t>(severity)];
}

std::string toldText(std::vector<Finding> const& findings, Style const& style)
{
    std::vector<std::vector<Cell>> rows;
    for (Finding const& finding : findings) {
        if (!isSuggestion(finding)) {
            rows.push_back({{finding.module}, {finding.what, findingMark(finding.severity)}, {finding.text}});
        }
    }
    return rows.empty() ? std::string() : drawColumns(rows, "  ", style);
}

std::string pointText(std::string const& text, Style const& style)
{
    std::string lines = wrapped(text, textColumns, "      ", style);
    lines[4] = '-';
    return lines;
}

std::string suggestionText(Finding const& finding, Style const& style)
{
    std::string text = "  " + finding.module + "  " + style.paint(findingMark(finding.severity), finding.what) + "\n" +
                       wrapped(finding.text, textColumns, "    ", style) + "    " + texts::finding::because + "\n";
    for (Evidence const& each : finding.evidence) {
        text += pointText(each.text, style);
    }
    text += std::string("    ") + texts::finding::orElse + "\n";
    for (std::string const& each : finding.otherwise) {
        text += pointText(each, style);
    }
    return text;
}

} // namespace

// What the data suggests stands apart: it may be wrong.
std::string toText(std::vector<Finding> const& findings, Style const& style)
{
    std::string const told = toldText(findings, style);
    std::string text = std::string(texts::findings) + "\n" +
                       (told.empty() ? "  " + style.paint(Mark::Good, texts::plain::noFindings) + "\n" : told);
    bool first = true;
    for (Finding const& finding : findings) {
        if (isSuggestion(finding)) {
            text += (first ? std::string("\n") + texts::suggested + "\n" : "") + suggestionText(finding, style);
            first = false;
        }
    }
    return text;
}

std::string toText(InspectionReport const& report, Style const& style)
{
    static constexpr Mark marks[] = {Mark::Faint, Mark::Good, Mark::Warning};
    auto const verdict = static_cast<std::size_t>(report.verdict);
    std::string text = std::string(texts::inspection::title) + "\n" +
                       labelledLine(texts::inspection::verdictLabel,
                                    style.paint(marks[verdict], texts::inspection::verdicts[verdict]));
    for (std::string const& reason : report.reasons) {
        text += labelledLine(texts::inspection::reasonLabel, reason);
    }
    text += labelledLine(texts::inspection::ruleLabel, report.name) +
            labelledLine(texts::inspection::dateLabel, report.date);
    if (report.modelYear) {
        text += labelledLine(texts::inspection::yearLabel,
                             report.yearByVin ? fmt::format(texts::inspection::yearByVin, *report.modelYear)
                                              : fmt::format(texts::inspection::yearByOption, *report.modelYear));
    }
    for (std::string const& note : report.notes) {
        text += labelledLine(texts::inspection::noteLabel, note);
    }
    return text;
}

} // namespace velmora
