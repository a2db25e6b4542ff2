#include "velmora/codereader.h"
#include "velmora/command/commands.h"
#include "velmora/commandline.h"
#include "velmora/failure.h"
#include "velmora/session.h"
#include "velmora/view/vehiclereport.h"

#include <algorithm>
#include <cstdio>
#include <fmt/format.h>
#include <obd/iecu.h>

namespace velmora {

namespace {

constexpr unsigned int replyLimitMs = 500;

// The driver keeps the bus family only; the adapter tells the number, behind an A if it searched for it.
ProtocolReport readProtocol(Session& session)
{
    ProtocolReport report{std::nullopt, session.adapter()->getProtocolDescription()};
    std::string reply;
    if (session.proxy()->execute("ATDPN", reply, replyLimitMs) == obd::IDevice::Status::Ok) {
        std::size_t const digit = reply.find_first_of("123456789");
        if (digit != std::string::npos) {
            report.number = reply[digit] - '0';
        }
    }
    return report;
}

AdapterReport readAdapter(Session& session)
{
    std::shared_ptr<obd::IAdapter> const adapter = session.adapter();
    float const volts = session.proxy()->batteryVoltage();
    return {session.port(), adapter->device(), adapter->description(), adapter->identification(),
            volts > 0.0F ? std::optional(volts) : std::nullopt};
}

bool isSensor(unsigned char id)
{
    return (id & 0x1F) != 0 && id > 0x02;
}

ModuleReport readModule(obd::IEcu const& ecu, CodeReader& reader)
{
    ModuleReport report{ecu.id(), ecu.name(), ecu.description(), ecu.standardDescription(), {}, {}};
    for (unsigned char const id : ecu.supportedIds(obd::ObdMode::CurrentData, 0)) {
        if (isSensor(id)) {
            report.supported.push_back(id);
        }
    }
    report.codes = reader.read(ecu, {CodeKind::Confirmed, CodeKind::Pending, CodeKind::Permanent});
    return report;
}

// A car that tells none of its codes is not known to be free of them.
ExitCode check(VehicleReport const& report)
{
    auto const anyModule = [&report](bool (*holds)(CodeReport const&)) {
        return std::any_of(report.modules.begin(), report.modules.end(),
                           [holds](ModuleReport const& module) { return holds(module.codes); });
    };
    if (anyModule(hasFindings)) {
        return ExitCode::Findings;
    }
    if (!anyModule(canBeChecked)) {
        std::fflush(stdout);
        throw Failure(ExitCode::NotSupported, "No control module told its trouble codes, so there is nothing to check",
                      {"is the ignition on?"});
    }
    return ExitCode::Done;
}

ExitCode scan(bool checking, GlobalOptions const& options)
{
    Session session(options);
    session.connect();
    VehicleReport report;
    report.adapter = readAdapter(session);
    report.protocol = readProtocol(session);
    CodeReader reader(session);
    for (std::shared_ptr<obd::IEcu> const& ecu : session.obd().getEcuManager()->getEcus()) {
        report.modules.push_back(readModule(*ecu, reader));
    }
    session.check();
    fmt::print("{}", options.json ? toJson(report) : toText(report, outputStyle(options)));
    return checking ? check(report) : ExitCode::Done;
}

} // namespace

void addScanCommand(CommandLine& commandLine)
{
    auto const checking = std::make_shared<bool>(false);
    CLI::App* const command =
        commandLine.addCommand("scan", "Report on the adapter and all control modules",
                               [checking](GlobalOptions const& options) { return scan(*checking, options); });
    command->add_flag("--check", *checking,
                      "Exit with code 10 if the lamp is on or a code is confirmed or permanent; a pending one is none");
}

} // namespace velmora
