#include "libvelmora/history/scanjson.h"

#include "libvelmora/report/codereport.h"
#include "libvelmora/report/document/vehiclereportjson.h"
#include "libvelmora/report/jsonplace.h"
#include "libvelmora/vehicle/vin.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>
#include <charconv>

namespace velmora {

namespace {

constexpr std::uint32_t lineVersion = 1;
constexpr std::size_t longestName = 100;

using ScanTime = std::chrono::sys_time<std::chrono::milliseconds>;

[[noreturn]] void refuse(std::string const& why)
{
    throw Error(ErrorKind::Failed, "This is no line of an exported history: " + why,
                {"velmora history export FILE writes such files"});
}

// A number of so many digits in a text; -1 for anything else.
int digitsAt(std::string const& text, std::size_t place, std::size_t count)
{
    int number = -1;
    char const* const begin = text.data() + place;
    auto const [end, error] = std::from_chars(begin, begin + count, number);
    return error == std::errc() && end == begin + count && *begin != '-' ? number : -1;
}

ScanTime parseTime(std::string const& text)
{
    using namespace std::chrono;
    if (text.size() == timeText({}).size() && text[4] == '-' && text[7] == '-' && text[10] == 'T' && text[13] == ':' &&
        text[16] == ':' && text[19] == '.' && text.back() == 'Z') {
        int const parts[] = {digitsAt(text, 0, 4),  digitsAt(text, 5, 2),  digitsAt(text, 8, 2), digitsAt(text, 11, 2),
                             digitsAt(text, 14, 2), digitsAt(text, 17, 2), digitsAt(text, 20, 3)};
        year_month_day const date{year{parts[0]}, month{static_cast<unsigned>(parts[1])},
                                  day{static_cast<unsigned>(parts[2])}};
        bool const all = std::all_of(std::begin(parts), std::end(parts), [](int part) { return part >= 0; });
        if (all && date.ok() && parts[3] < 24 && parts[4] < 60 && parts[5] < 60) {
            return ScanTime(sys_days(date)) + hours(parts[3]) + minutes(parts[4]) + seconds(parts[5]) +
                   milliseconds(parts[6]);
        }
    }
    refuse("\"" + text + "\" is no time like " + timeText({}));
}

// The number that most names a car by: that of the first module that tells a real one.
std::string vinOf(VehicleReport const& report)
{
    for (ModuleReport const& module : report.modules) {
        if (isVin(module.info.vin) && module.info.vin.find_first_not_of('0') != std::string::npos) {
            return module.info.vin;
        }
    }
    return {};
}

Json parsedLine(std::string_view line)
{
    // Nothing that a report has lies deeper; what is nested without end would exhaust the stack.
    constexpr int deepest = 20;
    auto const notDeeper = [](int depth, Json::parse_event_t /*event*/, Json const& /*parsed*/) {
        return depth <= deepest ? true : throw Error(ErrorKind::Failed, "This is no line of an exported history");
    };
    Json document = Json::parse(line, notDeeper, false);
    if (document.is_discarded()) {
        refuse("it is no JSON");
    }
    return document;
}

} // namespace

// FNV-1a.
std::string hashOf(std::string const& document)
{
    std::uint64_t hash = 0xCBF29CE484222325;
    for (char const byte : document) {
        hash = (hash ^ static_cast<unsigned char>(byte)) * 0x100000001B3;
    }
    return fmt::format("{:016x}", hash);
}

std::string timeText(ScanTime time)
{
    using namespace std::chrono;
    auto const day = floor<days>(time);
    year_month_day const date(day);
    hh_mm_ss const clock(time - day);
    return fmt::format("{:04}-{:02}-{:02}T{:02}:{:02}:{:02}.{:03}Z", static_cast<int>(date.year()),
                       static_cast<unsigned>(date.month()), static_cast<unsigned>(date.day()), clock.hours().count(),
                       clock.minutes().count(), clock.seconds().count(), clock.subseconds().count());
}

KeptScan makeScan(VehicleReport const& report, std::string const& vehicle, ScanTime time, std::string const& program)
{
    std::string const vin = vinOf(report);
    KeptScan scan{0, vin.empty() ? vehicle : vin, time, program, {}, dumpedJson(toJsonValue(report))};
    if (scan.vehicle.empty()) {
        throw Error(ErrorKind::Failed, "The vehicle does not tell its identification number, so it needs a name",
                    {"--vehicle NAME gives it one, such as --vehicle golf"});
    }
    scan.hash = hashOf(scan.document);
    return scan;
}

VehicleReport reportOf(KeptScan const& scan)
{
    return parseReport(parsedLine(scan.document));
}

std::string toLine(KeptScan const& scan)
{
    Json const line = {{"velmora", "scan"},
                       {"version", lineVersion},
                       {"vehicle", scan.vehicle},
                       {"time", timeText(scan.time)},
                       {"program", scan.program},
                       {"hash", scan.hash},
                       {"report", parsedLine(scan.document)}};
    return dumpedJson(line) + "\n";
}

KeptScan parseLine(std::string_view line)
{
    Json const document = parsedLine(line);
    JsonPlace const root(document);
    if (root.at("velmora").text() != "scan" || root.at("version").whole(lineVersion) != lineVersion) {
        refuse("it is of another kind or version");
    }
    KeptScan scan{0,
                  root.at("vehicle").text(),
                  parseTime(root.at("time").text()),
                  root.at("program").text(),
                  root.at("hash").text(),
                  {}};
    if (scan.vehicle.empty() || scan.vehicle.size() > longestName) {
        refuse("its vehicle has no name, or too long a one");
    }
    root.at("report");
    scan.document = dumpedJson(document.at("report"));
    if (hashOf(scan.document) != scan.hash) {
        refuse("its report was changed since it was written");
    }
    parseReport(document.at("report"));
    return scan;
}

ScanFacts factsOf(KeptScan const& scan)
{
    VehicleReport const report = reportOf(scan);
    ScanFacts facts;
    facts.modules = report.modules.size();
    for (ModuleReport const& module : report.modules) {
        if (module.codes.lamp) {
            facts.lamp = facts.lamp.value_or(false) || *module.codes.lamp;
        }
        for (CodeList const& list : module.codes.lists) {
            for (TroubleCode const& code : list.codes) {
                if (list.kind != CodeKind::Pending && std::ranges::count(facts.codes, code.code) == 0) {
                    facts.codes.push_back(code.code);
                }
            }
        }
    }
    return facts;
}

std::string toJson(KeptScan const& scan)
{
    ScanFacts const facts = factsOf(scan);
    return printed({{"number", scan.number},
                    {"vehicle", scan.vehicle},
                    {"time", timeText(scan.time)},
                    {"program", scan.program},
                    {"lamp", valueOrNull(facts.lamp)},
                    {"codes", facts.codes},
                    {"modules", facts.modules}});
}

} // namespace velmora
