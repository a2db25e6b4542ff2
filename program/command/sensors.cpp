#include "common/text/layout.h"
#include "common/text/text.h"
#include "libvelmora/read/oxygencurrent.h"
#include "libvelmora/read/topicanswer.h"
#include "libvelmora/report/unitlabel.h"
#include "libvelmora/vehicle/pidtitles.h"
#include "libvelmora/vehicle/units.h"
#include "program/command/commands.h"
#include "program/command/commandsession.h"
#include "program/command/sensoroffers.h"
#include "program/commandline.h"
#include "program/view/json.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <obd/iecu.h>
#include <obd/sensorpids.h>

#include <fmt/format.h>

#include <cmath>

namespace velmora::cli {

namespace {

struct Service
{
    obd::ObdMode mode;
    char const* title;
};

constexpr Service services[] = {
    {obd::ObdMode::CurrentData, "01 current data"},
    {obd::ObdMode::MonitorTests, "06 monitor tests"},
    {obd::ObdMode::SystemControl, "08 system control"},
    {obd::ObdMode::VehicleInformation, "09 vehicle information"},
};

// Without the markers that only tell of the next range.
std::vector<std::string> identifiers(obd::IEcu const& ecu, obd::ObdMode mode)
{
    std::vector<std::string> texts;
    for (unsigned char const id : ecu.supportedIds(mode, 0)) {
        if (!obd::isSupportMask(id)) {
            texts.push_back(fmt::format("{:02X}", id));
        }
    }
    return texts;
}

struct SensorsOptions
{
    bool all = false;
};

// How the list is to be shown.
struct ListStyle
{
    bool all;
    Units units;
    Style text;
};

char const* label(obd::SensorDataModel const& sensor, Units units)
{
    return labelInUnits(unitLabel(sensor.uid, sensor.unit), sensor.unit, units);
}

// An end of the sensor's range, in whole numbers as the library gives it.
int limit(obd::SensorDataModel const& sensor, int number, Units units)
{
    return static_cast<int>(std::lround(inUnits(shownNumber(sensor.uid, number), sensor.unit, units)));
}

std::string range(obd::SensorDataModel const& sensor, Units units)
{
    return sensor.numeric != nullptr ? fmt::format("{} to {}", limit(sensor, sensor.numeric->minimum, units),
                                                   limit(sensor, sensor.numeric->maximum, units))
                                     : "text";
}

using Rows = std::vector<std::vector<Cell>>;

void addOffer(Rows& rows, Offer const& offer, ListStyle const& style)
{
    std::string lead = fmt::format("{:02X}", static_cast<int>(offer.parameter->id));
    for (auto const& sensor : offer.parameter->sensors) {
        rows.push_back({{lead}, {sensor->name}, {label(*sensor, style.units)}, {range(*sensor, style.units)}});
        if (style.all) {
            rows.back().push_back({offer.offered ? "offered" : "-"});
        }
        lead.clear();
    }
}

void addLater(Rows& rows, unsigned char pid)
{
    std::vector<BuiltinPid> const values = laterValues(pid);
    std::string lead = fmt::format("{:02X}", pid);
    if (values.empty()) {
        rows.push_back({{lead}, {std::string(pidTitle(pid)) + " (not decoded)"}});
    }
    for (BuiltinPid const& each : values) {
        std::string const how = fmt::format("{} ({})", each.signal.id, standingWord(each.standing));
        rows.push_back({{lead}, {each.signal.name}, {each.signal.unit}, {how}});
        lead.clear();
    }
}

// Why a set may lack what the module has; empty if it was read.
std::string whyUnknown(obd::IEcu const& ecu, obd::ObdMode mode)
{
    TopicAnswer const answer = toAnswer(ecu.detection(mode, 0));
    bool const refused = answer == TopicAnswer::Refused && mode == obd::ObdMode::CurrentData; // which all modules have
    return answer == TopicAnswer::Silent || answer == TopicAnswer::Unreadable || refused
               ? fmt::format(" (not known in full: {})", answerWord(answer))
               : std::string();
}

std::string offerText(obd::IEcu const& ecu, ListStyle const& style)
{
    std::string text =
        fmt::format("Control module {:X}: {} ({})\n", ecu.id(), readable(ecu.name()), readable(ecu.description()));
    for (Service const& service : services) {
        std::vector<std::string> const ids = identifiers(ecu, service.mode);
        text += fmt::format("  {:<24} {}{}\n", service.title,
                            ids.empty() ? "-" : fmt::format("{}", fmt::join(ids, " ")), whyUnknown(ecu, service.mode));
    }
    Rows rows;
    for (Offer const& offer : offers(style.all)) {
        addOffer(rows, offer, style);
    }
    for (unsigned char const pid : undecoded(ecu)) {
        addLater(rows, pid);
    }
    return text + "\n" + drawColumns(rows, "  ", style.text) + "\n";
}

Json sensorJson(obd::SensorDataModel const& sensor, Units units)
{
    bool const ranged = sensor.numeric != nullptr;
    return {{"uid", sensor.uid},
            {"name", sensor.name},
            {"unit", textOrNull(label(sensor, units))},
            {"minimum", ranged ? Json(limit(sensor, sensor.numeric->minimum, units)) : Json(nullptr)},
            {"maximum", ranged ? Json(limit(sensor, sensor.numeric->maximum, units)) : Json(nullptr)}};
}

Json toJson(obd::IEcu const& ecu, ListStyle const& style)
{
    Json supported;
    for (Service const& service : services) {
        supported[std::string(service.title, 2)] = identifiers(ecu, service.mode);
    }
    Json parameters = Json::array();
    for (Offer const& offer : offers(style.all)) {
        Json sensorList = Json::array();
        for (auto const& sensor : offer.parameter->sensors) {
            sensorList.push_back(sensorJson(*sensor, style.units));
        }
        parameters.push_back({{"id", fmt::format("{:02X}", static_cast<int>(offer.parameter->id))},
                              {"name", offer.parameter->name},
                              {"offered", offer.offered},
                              {"sensors", sensorList}});
    }
    Json rest = Json::array();
    for (unsigned char const pid : undecoded(ecu)) {
        Json values = Json::array();
        for (BuiltinPid const& each : laterValues(pid)) {
            values.push_back({{"sensor", each.signal.id},
                              {"name", each.signal.name},
                              {"unit", textOrNull(each.signal.unit)},
                              {"standing", standingWord(each.standing)}});
        }
        rest.push_back({{"id", fmt::format("{:02X}", pid)}, {"name", pidTitle(pid)}, {"values", values}});
    }
    return {{"id", fmt::format("{:X}", ecu.id())},
            {"name", textOrNull(ecu.name())},
            {"description", textOrNull(ecu.description())},
            {"supported", supported},
            {"parameters", parameters},
            {"undecoded", rest}};
}

ExitCode sensors(GlobalOptions const& options, bool all)
{
    CommandSession session(options);
    session.connect();
    session.checkAdapter();
    ListStyle const style{all, session.units(), outputStyle(options)};
    Json modules = Json::array();
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        session.select(*ecu);
        if (options.json) {
            modules.push_back(toJson(*ecu, style));
        } else {
            printText(offerText(*ecu, style));
        }
    }
    if (options.json) {
        fmt::print("{}", printed(modules));
    }
    return ExitCode::Done;
}

} // namespace

void addSensorsCommand(CommandLine& commandLine)
{
    auto const chosen = std::make_shared<SensorsOptions>();
    CLI::App* const command =
        commandLine.addCommand("sensors", "List what the vehicle offers, by control module",
                               [chosen](GlobalOptions const& options) { return sensors(options, chosen->all); });
    command->add_flag("--all", chosen->all, "Also what the vehicle does not offer");
}

} // namespace velmora::cli
