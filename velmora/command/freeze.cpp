#include "velmora/codereader.h"
#include "velmora/command/commands.h"
#include "velmora/commandline.h"
#include "velmora/failure.h"
#include "velmora/view/freezereport.h"
#include "velmora/view/unitlabel.h"

#include <algorithm>
#include <cstdio>
#include <fmt/format.h>
#include <obd/troublecodecatalogue.h>

namespace velmora {

namespace {

FreezeFrame::Reading toReading(obd::SensorDataModel const& sensor)
{
    return {sensor.name, sensor.value ? std::optional(sensor.value->value) : std::nullopt, unitLabel(sensor.unit)};
}

// The library gives the generic meaning only; the catalogue knows the makers' as well.
TroubleCode explain(obd::DtcDataModel const& model)
{
    return groupByCode(obd::TroubleCodeCatalogue::getTroubleCodes(model.code)).front();
}

std::optional<FreezeFrame> readFrame(Session& session, obd::ITroubleCodeService& service, unsigned char frame)
{
    std::vector<obd::ParameterIdentifier::Id> const pids = service.fetchFreezeFramePids(frame);
    auto const code = pids.empty() ? nullptr : service.fetchFreezeFrameTroubleCode(frame);
    session.check();
    if (code == nullptr) {
        return std::nullopt;
    }
    FreezeFrame found{explain(*code), {}};
    for (obd::ParameterIdentifier::Id const pid : pids) {
        for (auto const& sensor : service.fetchFreezeFrameSensors(frame, pid)) {
            found.readings.push_back(toReading(*sensor));
        }
        session.check();
    }
    return found;
}

ExitCode freeze(unsigned int frame, GlobalOptions const& options)
{
    auto const number = static_cast<unsigned char>(frame);
    Session session(options);
    session.connect();
    auto const service = obd::TroubleCodeServiceBuilder::createTroubleCodeService();
    std::vector<ModuleFreeze> modules;
    for (std::shared_ptr<obd::IEcu> const& ecu : selectedModules(session)) {
        session.obd().getEcuManager()->setCurrentEcu(ecu->id());
        auto const found = readFrame(session, *service, number);
        bool const offered = !ecu->supportedIds(obd::ObdMode::FreezeFrame, number).empty();
        modules.push_back({ecu->id(), ecu->name(), offered, found});
    }
    fmt::print("{}", options.json ? toJson(modules, frame) : toText(modules, frame));
    if (std::none_of(modules.begin(), modules.end(), [](ModuleFreeze const& module) { return module.offered; })) {
        std::fflush(stdout);
        throw Failure(ExitCode::NotSupported, fmt::format("No control module answers for freeze frame {}", frame),
                      {"vehicles with no code stored may not answer; most know frame 0 only"});
    }
    return ExitCode::Done;
}

} // namespace

void addFreezeCommand(CommandLine& commandLine)
{
    auto const frame = std::make_shared<unsigned int>(0);
    CLI::App* const command =
        commandLine.addCommand("freeze", "Show what the vehicle froze when a code was set",
                               [frame](GlobalOptions const& options) { return freeze(*frame, options); });
    command->add_option("FRAME", *frame, "Number of the frame (0)")->check(CLI::Range(0, 255));
}

} // namespace velmora
