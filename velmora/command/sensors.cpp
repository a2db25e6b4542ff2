#include "velmora/command/commands.h"
#include "velmora/commandline.h"
#include "velmora/session.h"

#include <fmt/format.h>
#include <nlohmann/json.hpp>
#include <obd/iecu.h>
#include <obd/parameterdescriptor.h>

namespace velmora {

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
        if ((id & 0x1F) != 0) {
            texts.push_back(fmt::format("{:02X}", id));
        }
    }
    return texts;
}

void printText(Session& session, obd::IEcu const& ecu)
{
    fmt::print("Control module {:X}: {} ({})\n", ecu.id(), ecu.name(), ecu.description());
    for (Service const& service : services) {
        std::vector<std::string> const ids = identifiers(ecu, service.mode);
        fmt::print("  {:<24} {}\n", service.title, ids.empty() ? "-" : fmt::format("{}", fmt::join(ids, " ")));
    }
    fmt::print("\n");
    for (auto const& parameter : session.obd().getEcuManager()->getParameters(ecu.id())) {
        fmt::print("  {:02X}  {}\n", static_cast<int>(parameter->pid()), parameter->description());
    }
    fmt::print("\n");
}

nlohmann::ordered_json toJson(Session& session, obd::IEcu const& ecu)
{
    nlohmann::ordered_json supported;
    for (Service const& service : services) {
        supported[std::string(service.title, 2)] = identifiers(ecu, service.mode);
    }
    nlohmann::ordered_json parameters = nlohmann::ordered_json::array();
    for (auto const& parameter : session.obd().getEcuManager()->getParameters(ecu.id())) {
        parameters.push_back(
            {{"id", fmt::format("{:02X}", static_cast<int>(parameter->pid()))}, {"name", parameter->description()}});
    }
    return {{"id", fmt::format("{:X}", ecu.id())},
            {"name", ecu.name()},
            {"description", ecu.description()},
            {"supported", supported},
            {"parameters", parameters}};
}

ExitCode sensors(GlobalOptions const& options)
{
    Session session(options);
    session.connect();
    nlohmann::ordered_json modules = nlohmann::ordered_json::array();
    for (std::shared_ptr<obd::IEcu> const& ecu : session.obd().getEcuManager()->getEcus()) {
        if (options.ecu && ecu->id() != *options.ecu) {
            continue;
        }
        if (options.json) {
            modules.push_back(toJson(session, *ecu));
        } else {
            printText(session, *ecu);
        }
    }
    if (options.json) {
        fmt::print("{}\n", modules.dump(2));
    }
    return ExitCode::Done;
}

} // namespace

void addSensorsCommand(CommandLine& commandLine)
{
    commandLine.addCommand("sensors", "List what the vehicle offers, by control module", sensors);
}

} // namespace velmora
