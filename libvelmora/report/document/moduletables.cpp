#include "libvelmora/report/document/moduletables.h"

#include "libvelmora/report/finding/testlimits.h"
#include "libvelmora/report/limittest.h"
#include "libvelmora/report/texts/labels.h"

#include <fmt/format.h>

#include <algorithm>
#include <array>
#include <optional>
#include <string_view>

namespace velmora {

namespace {

DocumentCell numberCell(std::string text)
{
    return {std::move(text), DocumentMark::None, true};
}

std::optional<LimitBar> barFor(LimitTest const& test)
{
    auto const limits = limitsOf(test);
    bool const flat = limits && limits->min && limits->max && *limits->min == *limits->max;
    return limits && !flat ? std::optional(LimitBar{limits->value, limits->min, limits->max}) : std::nullopt;
}

std::vector<DocumentCell> testRow(LimitTest const& test)
{
    static constexpr DocumentMark marks[] = {DocumentMark::Bad, DocumentMark::Good, DocumentMark::Faint,
                                             DocumentMark::None};
    auto const verdict = static_cast<std::size_t>(test.verdict);
    return {{texts::verdicts[verdict], marks[verdict]},
            {fmt::format("{} {}", testId(test.id), test.description)},
            {test.value, DocumentMark::None, true, barFor(test)},
            numberCell(test.minimum),
            numberCell(test.maximum),
            {test.unit}};
}

// A counter of a monitor, by what stands before and behind "completion" or "conditions encountered" in its name.
struct CounterName
{
    std::string monitor;
    bool completed;
};

// The names are the core's: "Catalyst Monitor Completion Counts Bank 1".
std::optional<CounterName> readName(std::string const& name)
{
    static constexpr std::array<std::pair<std::string_view, bool>, 4> marks = {
        {{" Completion Condition Counts", true},
         {" Completion Conditions Counts", true},
         {" Completion Counts", true},
         {" Conditions Encountered Counts", false}}};
    for (auto const& [mark, completed] : marks) {
        std::size_t const place = name.find(mark);
        if (place != std::string::npos && !name.starts_with("OBD ")) {
            return CounterName{name.substr(0, place) + name.substr(place + mark.size()), completed};
        }
    }
    return std::nullopt;
}

struct MonitorCounts
{
    std::string monitor;
    std::optional<unsigned int> completed;
    std::optional<unsigned int> met;
};

// A name that comes twice is no pair but two: the second stands by itself.
MonitorCounts& rowFor(std::vector<MonitorCounts>& rows, CounterName const& name)
{
    auto const found = std::find_if(rows.begin(), rows.end(), [&name](MonitorCounts const& row) {
        return row.monitor == name.monitor && !(name.completed ? row.completed : row.met);
    });
    return found != rows.end() ? *found : rows.emplace_back(MonitorCounts{name.monitor, {}, {}});
}

// The counters that are 0 are not in the list.
DocumentTable ratioTable(std::vector<MonitorCounts> const& rows)
{
    DocumentTable table{
        {{texts::monitor}, numberCell(texts::completed), numberCell(texts::conditionsMet), numberCell(texts::ratio)},
        {}};
    for (MonitorCounts const& row : rows) {
        unsigned int const completed = row.completed.value_or(0);
        unsigned int const met = row.met.value_or(0);
        table.rows.push_back({{row.monitor},
                              numberCell(std::to_string(completed)),
                              numberCell(std::to_string(met)),
                              numberCell(ratioText(completed, met))});
    }
    return table;
}

} // namespace

std::vector<DocumentCell> codeRow(char const* kind, TroubleCode const& code, DocumentMark mark)
{
    TroubleCode::Meaning const* const meaning = meaningOf(code);
    return {{kind}, {code.code, mark}, {meaning != nullptr ? meaning->maker : std::string()}, {meaningText(code)}};
}

DocumentTable testTable(std::string const& name, std::vector<LimitTest> const& tests)
{
    DocumentTable table{{{texts::result},
                         {name.empty() ? std::string(texts::test) : name},
                         numberCell(texts::value),
                         numberCell(texts::minimum),
                         numberCell(texts::maximum),
                         {texts::unit}},
                        {}};
    for (LimitTest const& test : tests) {
        table.rows.push_back(testRow(test));
    }
    return table;
}

std::vector<DocumentBlock> counterTables(CountersReport const& report)
{
    std::vector<MonitorCounts> monitors;
    DocumentTable others{{{texts::counter}, numberCell(texts::value)}, {}};
    for (CountersReport::Counter const& each : report.counters) {
        if (auto const name = readName(each.name)) {
            MonitorCounts& row = rowFor(monitors, *name);
            (name->completed ? row.completed : row.met) = each.value;
        } else {
            others.rows.push_back({{each.name}, numberCell(std::to_string(each.value))});
        }
    }
    std::vector<DocumentBlock> blocks;
    if (!monitors.empty()) {
        blocks.emplace_back(ratioTable(monitors));
    }
    if (!others.rows.empty()) {
        blocks.emplace_back(std::move(others));
    }
    if (blocks.empty()) {
        blocks.emplace_back(DocumentParagraph{{texts::allZero}});
    }
    return blocks;
}

DocumentTable valueTable(std::vector<LiveValue> const& values)
{
    DocumentTable table{{{texts::sensor}, numberCell(texts::value), {texts::unit}}, {}};
    for (LiveValue const& value : values) {
        table.rows.push_back({{value.name}, numberCell(value.value), {value.unit}});
    }
    return table;
}

std::string ratioText(unsigned int part, unsigned int whole)
{
    return whole == 0 ? std::string() : fmt::format("{:.2f}", static_cast<double>(part) / whole);
}

} // namespace velmora
