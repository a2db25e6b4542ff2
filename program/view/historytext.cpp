#include "program/view/historytext.h"

#include "libvelmora/history/scanjson.h"
#include "libvelmora/report/texts/changetexts.h"
#include "program/view/layout.h"

#include <fmt/format.h>

#include <algorithm>
#include <ctime>

namespace velmora::cli {

namespace {

std::string localTime(KeptScan const& scan)
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
    Json const facts = toJsonValue(scan);
    std::vector<std::string> const codes = facts["codes"];
    Json const& lamp = facts["lamp"];
    bool const on = lamp.is_boolean() && lamp.get<bool>();
    return {{std::to_string(scan.number), Mark::None, true},
            {localTime(scan)},
            {lamp.is_null() ? "lamp -"
             : on           ? "lamp on"
                            : "lamp off",
             on ? Mark::Bad : Mark::None},
            {codes.empty() ? "no codes" : fmt::format("{}", fmt::join(codes, " ")),
             codes.empty() ? Mark::None : Mark::Bad}};
}

Mark changeMark(ChangeWeight weight)
{
    static constexpr Mark marks[] = {Mark::None, Mark::Good, Mark::Bad};
    return marks[static_cast<std::size_t>(weight)];
}

std::vector<Cell> changeRow(Change const& change)
{
    static constexpr char const* words[] = {"", "better", "worse"};
    std::string const values =
        change.before.empty() && change.after.empty() ? std::string() : change.before + " -> " + change.after;
    std::string const item = change.name.empty() ? values : values.empty() ? change.name : change.name + ": " + values;
    return {{words[static_cast<std::size_t>(change.weight)], changeMark(change.weight)},
            {change.module},
            {change.what},
            {item}};
}

} // namespace

std::string historyText(std::vector<KeptScan> const& scans, Style const& style)
{
    if (scans.empty()) {
        return "Nothing is kept yet; velmora scan --history keeps a scan\n";
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

std::string diffText(KeptScan const& older, KeptScan const& newer, std::vector<Change> const& changes,
                     Style const& style)
{
    std::string const text = fmt::format("{}\n  scan {} of {}\n  scan {} of {}\n\n{}\n", newer.vehicle, older.number,
                                         localTime(older), newer.number, localTime(newer), texts::change::title);
    if (changes.empty()) {
        return text + "  " + style.paint(Mark::Good, texts::change::none) + "\n";
    }
    std::vector<std::vector<Cell>> rows;
    for (Change const& change : changes) {
        rows.push_back(changeRow(change));
    }
    return text + drawColumns(rows, "  ", style);
}

} // namespace velmora::cli
