#include "libvelmora/report/document/reportsections.h"
#include "libvelmora/report/texts/findingtexts.h"
#include "libvelmora/report/texts/inspectiontexts.h"
#include "libvelmora/report/texts/labels.h"

#include <fmt/format.h>

namespace velmora {

namespace {

DocumentMark markOf(Severity severity)
{
    static constexpr DocumentMark marks[] = {DocumentMark::None, DocumentMark::Warning, DocumentMark::Bad};
    return marks[static_cast<std::size_t>(severity)];
}

DocumentNote noteOf(Finding const& finding)
{
    static constexpr char const* words[] = {texts::finding::note, texts::finding::warning, texts::finding::bad};
    DocumentNote note{{words[static_cast<std::size_t>(finding.severity)], markOf(finding.severity)},
                      finding.module + ", " + finding.what,
                      finding.text,
                      {{texts::finding::because1, {}}, {texts::finding::orElse1, {}}}};
    for (Evidence const& each : finding.evidence) {
        DocumentCell cell(each.text);
        cell.link = anchorOf(each);
        note.lists[0].second.push_back(std::move(cell));
    }
    for (std::string const& each : finding.otherwise) {
        note.lists[1].second.emplace_back(each);
    }
    return note;
}

DocumentTable toldTable(std::vector<Finding> const& list)
{
    DocumentTable table{{{texts::kind}, {texts::module}, {texts::meaning}}, {}};
    for (Finding const& each : list) {
        if (!isSuggestion(each)) {
            DocumentCell text(each.text);
            text.link = each.evidence.empty() ? std::string() : anchorOf(each.evidence.front());
            table.rows.push_back({{each.what, markOf(each.severity)}, {each.module}, text});
        }
    }
    return table;
}

} // namespace

DocumentSection inspectionSection(InspectionReport const& report)
{
    static constexpr DocumentMark marks[] = {DocumentMark::Faint, DocumentMark::Good, DocumentMark::Warning};
    auto const verdict = static_cast<std::size_t>(report.verdict);
    DocumentFacts rows;
    rows.rows.push_back({texts::inspection::verdictLabel, {texts::inspection::verdicts[verdict], marks[verdict]}});
    for (std::string const& reason : report.reasons) {
        rows.rows.push_back({texts::inspection::reasonLabel, {reason}});
    }
    rows.rows.push_back({texts::inspection::ruleLabel, {report.name}});
    rows.rows.push_back({texts::inspection::dateLabel, {report.date}});
    if (report.modelYear) {
        rows.rows.push_back({texts::inspection::yearLabel,
                             {report.yearByVin ? fmt::format(texts::inspection::yearByVin, *report.modelYear)
                                               : fmt::format(texts::inspection::yearByOption, *report.modelYear)}});
    }
    for (std::string const& note : report.notes) {
        rows.rows.push_back({texts::inspection::noteLabel, {note}});
    }
    return {1, texts::inspection::title, {rows}, "inspection"};
}

std::vector<DocumentSection> findingSections(std::vector<Finding> const& list)
{
    DocumentSection told{1, texts::findings, {}, "findings"};
    DocumentTable table = toldTable(list);
    if (table.rows.empty()) {
        told.blocks.push_back(DocumentParagraph{{texts::noFindings, DocumentMark::Good}});
    } else {
        told.blocks.push_back(std::move(table));
    }
    DocumentSection suggested{1, texts::suggested, {}, "suggestions"};
    for (Finding const& each : list) {
        if (isSuggestion(each)) {
            suggested.blocks.push_back(noteOf(each));
        }
    }
    return suggested.blocks.empty() ? std::vector{told} : std::vector{told, suggested};
}

} // namespace velmora
