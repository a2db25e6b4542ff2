#include "libvelmora/read/oxygencurrent.h"
#include "libvelmora/read/topicanswer.h"
#include "libvelmora/report/json.h"
#include "libvelmora/report/unitlabel.h"
#include "libvelmora/signal/builtinpids.h"
#include "libvelmora/text/text.h"
#include "libvelmora/vehicle/pidtitles.h"
#include "program/command/commands.h"
#include "program/command/commandsession.h"
#include "program/commandline.h"
#include "program/view/printtext.h"

#include <obd/iecu.h>
#include <obd/iecuservice.h>
#include <obd/sensorpids.h>

#include <fmt/format.h>

#include <algorithm>
#include <iterator>

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

struct Offer
{
    std::shared_ptr<obd::ParameterDataModel> parameter;
    bool offered;
};

// What the library can show of the selected module; all of it, or what the module offers.
std::vector<Offer> offers(bool all)
{
    std::vector<Offer> list;
    auto const service = obd::EcuServiceBuilder::createEcuService();
    auto parameters = service->supportedParameters();
    auto const further = service->furtherParameters();
    parameters.insert(parameters.end(), further.begin(), further.end());
    for (auto const& parameter : parameters) {
        bool const offered = service->isParameterSupported(parameter);
        if (offered || all) {
            list.push_back({parameter, offered});
        }
    }
    return list;
}

std::string range(obd::SensorDataModel const& sensor)
{
    return sensor.numeric != nullptr ? fmt::format("{} to {}", shownNumber(sensor.uid, sensor.numeric->minimum),
                                                   shownNumber(sensor.uid, sensor.numeric->maximum))
                                     : "text";
}

std::string offerText(Offer const& offer, bool all)
{
    std::string text;
    std::string lead = fmt::format("{:02X}", static_cast<int>(offer.parameter->id));
    for (auto const& sensor : offer.parameter->sensors) {
        std::string const line = fmt::format("  {:<2}  {:<58}  {:<8}  {}", lead, sensor->name,
                                             unitLabel(sensor->uid, sensor->unit), range(*sensor));
        text += all ? fmt::format("{:<92}{}\n", line, offer.offered ? "offered" : "-") : line + "\n";
        lead.clear();
    }
    return text;
}

// Why a set may lack what the module has; empty if it was read.
std::string whyUnknown(obd::IEcu const& ecu, obd::ObdMode mode)
{
    TopicAnswer const answer = toAnswer(ecu.detection(mode, 0));
    return answer == TopicAnswer::Silent || answer == TopicAnswer::Unreadable
               ? fmt::format(" (not known in full: {})", answerWord(answer))
               : std::string();
}

// Up to it the library knows all PIDs, some of which are no parameters of their own.
constexpr unsigned char lastWellKnownPid = 0x7F;

// What the module offers and the library does not decode.
std::vector<unsigned char> undecoded(obd::IEcu const& ecu)
{
    std::vector<Offer> const known = offers(true);
    std::vector<unsigned char> pids = ecu.supportedIds(obd::ObdMode::CurrentData, 0);
    std::erase_if(pids, [&known](unsigned char pid) {
        bool const isLater = pid > lastWellKnownPid && !obd::isSupportMask(pid);
        return !isLater || std::any_of(known.begin(), known.end(), [pid](Offer const& offer) {
            return static_cast<int>(offer.parameter->id) == pid;
        });
    });
    return pids;
}

// The values of a PID that the library does not decode, as far as their layout is known, and how well it is.
std::vector<BuiltinPid> laterValues(unsigned char pid)
{
    std::vector<BuiltinPid> values;
    std::ranges::copy_if(builtinPids(), std::back_inserter(values),
                         [pid](BuiltinPid const& each) { return each.pid == pid && isDecoded(each); });
    return values;
}

std::string laterText(unsigned char pid)
{
    std::vector<BuiltinPid> const values = laterValues(pid);
    if (values.empty()) {
        return fmt::format("  {:02X}  {} (not decoded)\n", pid, pidTitle(pid));
    }
    std::string text;
    std::string lead = fmt::format("{:02X}", pid);
    for (BuiltinPid const& each : values) {
        text += fmt::format("  {:<2}  {:<58}  {:<8}  {} ({})\n", lead, each.signal.name, each.signal.unit,
                            each.signal.id, standingWord(each.standing));
        lead.clear();
    }
    return text;
}

std::string offerText(obd::IEcu const& ecu, bool all)
{
    std::string text =
        fmt::format("Control module {:X}: {} ({})\n", ecu.id(), readable(ecu.name()), readable(ecu.description()));
    for (Service const& service : services) {
        std::vector<std::string> const ids = identifiers(ecu, service.mode);
        text += fmt::format("  {:<24} {}{}\n", service.title,
                            ids.empty() ? "-" : fmt::format("{}", fmt::join(ids, " ")), whyUnknown(ecu, service.mode));
    }
    text += "\n";
    for (Offer const& offer : offers(all)) {
        text += offerText(offer, all);
    }
    for (unsigned char const pid : undecoded(ecu)) {
        text += laterText(pid);
    }
    return text + "\n";
}

Json sensorJson(obd::SensorDataModel const& sensor)
{
    Json json = {{"uid", sensor.uid}, {"name", sensor.name}, {"unit", textOrNull(unitLabel(sensor.uid, sensor.unit))}};
    json["minimum"] =
        sensor.numeric != nullptr ? Json(shownNumber(sensor.uid, sensor.numeric->minimum)) : Json(nullptr);
    json["maximum"] =
        sensor.numeric != nullptr ? Json(shownNumber(sensor.uid, sensor.numeric->maximum)) : Json(nullptr);
    return json;
}

Json toJson(obd::IEcu const& ecu, bool all)
{
    Json supported;
    for (Service const& service : services) {
        supported[std::string(service.title, 2)] = identifiers(ecu, service.mode);
    }
    Json parameters = Json::array();
    for (Offer const& offer : offers(all)) {
        Json sensorList = Json::array();
        for (auto const& sensor : offer.parameter->sensors) {
            sensorList.push_back(sensorJson(*sensor));
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
    Json modules = Json::array();
    for (std::shared_ptr<obd::IEcu> const& ecu : session.selectedModules()) {
        session.select(*ecu);
        if (options.json) {
            modules.push_back(toJson(*ecu, all));
        } else {
            printText(offerText(*ecu, all));
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
