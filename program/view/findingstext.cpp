#include "program/view/layout.h"
#include "program/view/reporttext.h"

namespace velmora::cli {

std::string toText(std::vector<Finding> const& findings, Style const& style)
{
    std::string const heading = "Findings\n";
    if (findings.empty()) {
        return heading + "  " + style.paint(Mark::Good, "none in what the vehicle told") + "\n";
    }
    std::vector<std::vector<Cell>> rows;
    for (Finding const& finding : findings) {
        Mark const mark = finding.severity == Severity::Bad ? Mark::Bad : Mark::Warning;
        rows.push_back({{finding.module}, {finding.what, mark}, {finding.text}});
    }
    return heading + drawColumns(rows, "  ", style);
}

} // namespace velmora::cli
