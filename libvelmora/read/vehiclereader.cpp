#include "libvelmora/read/vehiclereader.h"

#include "common/text/text.h"
#include "libvelmora/read/codereader.h"
#include "libvelmora/read/diagnosticreaders.h"
#include "libvelmora/read/freezereader.h"
#include "libvelmora/read/topicanswer.h"
#include "libvelmora/read/valuesreader.h"

#include <obd/iecu.h>
#include <obd/sensorpids.h>

#include <fmt/format.h>

namespace velmora {

namespace {

// How asking for what it supports went: of current data, and of the monitors where it tells any.
TopicAnswer answerOfSets(obd::IEcu const& ecu)
{
    TopicAnswer const sensors = toAnswer(ecu.detection(obd::ObdMode::CurrentData, 0));
    if (sensors != TopicAnswer::Read || ecu.supportedIds(obd::ObdMode::MonitorTests, 0).empty()) {
        return sensors;
    }
    return toAnswer(ecu.detection(obd::ObdMode::MonitorTests, 0));
}

std::vector<unsigned int> sensorsOf(obd::IEcu const& ecu)
{
    std::vector<unsigned int> sensors;
    for (unsigned char const id : ecu.supportedIds(obd::ObdMode::CurrentData, 0)) {
        if (obd::isSensor(id)) {
            sensors.push_back(id);
        }
    }
    return sensors;
}

// What one topic has told is not asked for again by the next.
ModuleReport readModule(Session& session, obd::IEcu const& ecu, CodeReader& reader)
{
    constexpr unsigned char newestFrame = 0;
    // Between the two readings of the values lies all else, which takes seconds: what is the same in both lasts.
    auto const bus = std::make_shared<GroupedPids>(session.proxy(), ecu.id());
    std::vector<LiveValue> values = readValues(session, ecu, bus);
    InfoReport info = readInfoBeside(session, ecu, values);
    CodeReport codes = reader.read(ecu, {CodeKind::Confirmed, CodeKind::Pending, CodeKind::Permanent});
    std::optional<bool> const lamp = codes.lamp;
    ModuleReport report{ecu.id(),
                        readable(ecu.name()),
                        sensorsOf(ecu),
                        std::move(info),
                        std::move(codes),
                        readFreeze(session, ecu, newestFrame),
                        readReadinessBeside(session, ecu, lamp),
                        readMonitors(session, ecu),
                        readOxygen(session, ecu),
                        readCounters(session, ecu),
                        answerOfSets(ecu),
                        {}};
    readValuesAgain(session, ecu, bus, values);
    report.values = std::move(values);
    return report;
}

void giveMeanings(VehicleReport& report, std::string const& named)
{
    std::vector<std::string> vins;
    for (ModuleReport const& module : report.modules) {
        vins.push_back(module.info.vin);
    }
    MakerChoice const maker = chooseMaker(named, vins);
    for (ModuleReport& module : report.modules) {
        applyMaker(module.codes, maker);
        applyMaker(module.freeze, maker);
    }
}

} // namespace

ProtocolReport readProtocol(Session& session)
{
    ProtocolReport report{std::nullopt, readable(session.adapter()->getProtocolDescription())};
    if (auto const protocol = session.proxy()->vehicleProtocol(); protocol != obd::VehicleProtocol::Automatic) {
        report.number = static_cast<int>(protocol);
    }
    return report;
}

AdapterReport readAdapter(Session& session)
{
    std::shared_ptr<obd::IAdapter> const adapter = session.adapter();
    float const volts = session.proxy()->batteryVoltage();
    return {readable(adapter->device()), readable(adapter->description()), readable(adapter->identification()),
            volts > 0.0F ? std::optional(volts) : std::nullopt};
}

VehicleReport readVehicle(Session& session, std::string const& maker)
{
    VehicleReport report;
    report.adapter = readAdapter(session);
    report.protocol = readProtocol(session);
    CodeReader reader(session);
    for (auto const& ecu : session.selectedModules()) {
        session.tellProgress(fmt::format("Reading {:X} {} ...\n", ecu->id(), readable(ecu->name())));
        report.modules.push_back(readModule(session, *ecu, reader));
    }
    session.checkAdapter();
    giveMeanings(report, maker);
    return report;
}

} // namespace velmora
