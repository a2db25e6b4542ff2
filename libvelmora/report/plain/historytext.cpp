#include "common/text/layout.h"
#include "libvelmora/report/plain/reporttext.h"
#include "libvelmora/report/texts/changetexts.h"
#include "libvelmora/report/texts/plaintexts.h"

#include <velmora/history.h>

#include <fmt/format.h>

#include <algorithm>
#include <ctime>

namespace velmora {

namespace {

std::string scanTime(KeptScan const& scan)
{
    std::time_t const seconds = std::chrono::system_clock::to_time_t(scan.time);
    std::tm fields{};
    ::localtime_r(&seconds, &fields);
    char text[32] = {};
    std::strftime(text, sizeof(text), "%Y-%m-%d %H:%M:%S", &fields);
    return text;
}

std::vector<Cell> scanRow(KeptScan const& scan)
{
    ScanFacts const facts = factsOf(scan);
    bool const on = facts.lamp.value_or(false);
    return {{std::to_string(scan.number), Mark::None, true},
            {scanTime(scan)},
            {!facts.lamp ? texts::plain::lampUnknown
             : on        ? texts::plain::lampOn
                         : texts::plain::lampOff,
             on ? Mark::Bad : Mark::None},
            {facts.codes.empty() ? texts::plain::noCodes : fmt::format("{}", fmt::join(facts.codes, " ")),
             facts.codes.empty() ? Mark::None : Mark::Bad}};
}

Mark changeMark(ChangeWeight weight)
{
    static constexpr Mark marks[] = {Mark::None, Mark::Good, Mark::Bad};
    return marks[static_cast<std::size_t>(weight)];
}

std::vector<Cell> changeRow(Change const& change)
{
    static constexpr char const* words[] = {"", texts::plain::better, texts::plain::worse};
    std::string const values =
        change.before.empty() && change.after.empty() ? std::string() : change.before + " -> " + change.after;
    std::string const item = change.name.empty() ? values : values.empty() ? change.name : change.name + ": " + values;
    return {{words[static_cast<std::size_t>(change.weight)], changeMark(change.weight)},
            {change.module},
            {change.what},
            {item}};
}

} // namespace

std::string toText(std::vector<KeptScan> const& scans, TextStyle const& chosen)
{
    Style const style = styleOf(chosen);
    if (scans.empty()) {
        return std::string(texts::plain::nothingKept) + "\n";
    }
    std::vector<std::string> vehicles;
    for (KeptScan const& scan : scans) {
        if (std::find(vehicles.begin(), vehicles.end(), scan.vehicle) == vehicles.end()) {
            vehicles.push_back(scan.vehicle);
        }
    }
    std::string text;
    for (std::string const& vehicle : vehicles) {
        std::vector<std::vector<Cell>> rows;
        for (KeptScan const& scan : scans) {
            if (scan.vehicle == vehicle) {
                rows.push_back(scanRow(scan));
            }
        }
        text += (text.empty() ? "" : "\n") + vehicle + "\n" + drawColumns(rows, "  ", style);
    }
    return text;
}

std::string toText(KeptScan const& older, KeptScan const& newer, std::vector<Change> const& changes,
                   TextStyle const& chosen)
{
    Style const style = styleOf(chosen);
    std::string const text = fmt::format(
        "{}\n  {}\n  {}\n\n{}\n", newer.vehicle, fmt::format(texts::plain::scanOf, older.number, scanTime(older)),
        fmt::format(texts::plain::scanOf, newer.number, scanTime(newer)), texts::change::title);
    if (changes.empty()) {
        return text + "  " + style.paint(Mark::Good, texts::change::none) + "\n";
    }
    std::vector<std::vector<Cell>> rows;
    for (Change const& change : changes) {
        rows.push_back(changeRow(change));
    }
    return text + drawColumns(rows, "  ", style);
}

} // namespace velmora
