// What an Ecu finds out of the oxygen sensors of its control module, and of their tests.

#include "libobd/bytes/bytes.h"
#include "libobd/module/ecu.h"
#include "libobd/parameters/supportedoids.h"
#include "libobd/powertrain/fueltrim.h"
#include "libobd/powertrain/oxygensensorspresent.h"

#include <common/logrecord.h>
#include <common/tracestream.h>
#include <obd/protocolfamily.h>

#include <algorithm>
#include <numeric>

namespace obd {
namespace {

constexpr unsigned char standardTests = 10; // of an oxygen sensor in service 05 (SAE J1979)

} // namespace

bool Ecu::detectOxygenSensors()
{
    switch (oxygenSensorBanks()) {
    case OxygenSensorBank::Pid13: {
        OxygenSensorsPresent13 query(ObdMode::CurrentData, 0);
        return updateEcuOxygenSensorLocations(query);
    }
    case OxygenSensorBank::Pid1D: {
        OxygenSensorsPresent1d query(ObdMode::CurrentData, 0);
        return updateEcuOxygenSensorLocations(query);
    }
    case OxygenSensorBank::None:
        break;
    }
    tervex::TraceStream << "No oxygen sensors banks";
    return true;
}

bool Ecu::updateEcuOxygenSensorLocations(OxygenSensorsPresent& query)
{
    if (!succeeds(query)) {
        TERVEX_LOG(Fatal) << "Failed to get supported O2 sensors";
        return false;
    }
    if (std::optional<std::vector<OxygenSensorLocation>> const locations = query.locations(*this)) {
        std::lock_guard const lock(m_mutex);
        m_oxygenSensorLocations = *locations;
    } else {
        tervex::TraceStream << "No oxygen sensors present";
    }
    return true;
}

void Ecu::setFuelTrimByteUsage()
{
    if (oxygenSensorBanks() == OxygenSensorBank::Pid1D && areAllPresentFor1D()) {
        FuelTrim::setByteBInUse(true);
    }
}

bool Ecu::areAllPresentFor1D() const
{
    using Location = OxygenSensorLocation;
    constexpr Location fourBanksOfTwo[] = {Location::Bank1Sensor1, Location::Bank1Sensor2, Location::Bank2Sensor1,
                                           Location::Bank2Sensor2, Location::Bank3Sensor1, Location::Bank3Sensor2,
                                           Location::Bank4Sensor1, Location::Bank4Sensor2};
    std::vector<Location> const present = oxygenSensorLocations();
    return std::all_of(std::begin(fourBanksOfTwo), std::end(fourBanksOfTwo), [&present](Location location) {
        return std::find(present.begin(), present.end(), location) != present.end();
    });
}

// On CAN there is no service 05: service 06 has its results.
bool Ecu::detectMode05Configuration()
{
    if (isCan(m_protocol)) {
        return true;
    }
    bool result = true;
    for (OxygenSensorLocation const location : oxygenSensorLocations()) {
        result &= detectTestIdentifiers(location);
        std::string list;
        for (unsigned char const tid : supportedTids(location)) {
            list += " 0x" + lowerHex(tid);
        }
        tervex::TraceStream << "Supported 05 TIDS for ECU " << lowerHex(m_id) << " location "
                            << static_cast<int>(location) << list;
    }
    return result;
}

bool Ecu::detectTestIdentifiers(OxygenSensorLocation location)
{
    std::vector<unsigned char> found{0};
    bool const result = detectFirstTestIdentifiers(location, found);
    for (unsigned int base = rangeSize; base <= lastRange && std::find(found.begin(), found.end(), base) != found.end();
         base += rangeSize) {
        Service05Oids query(static_cast<unsigned char>(base), oxygenSensorByte(location));
        if (!succeeds(query)) {
            TERVEX_LOG(Fatal) << "Failed to get supported 05 TIDs 0x" << lowerHex(base + 1) << " - 0x"
                              << lowerHex(base + rangeSize);
            break;
        }
        for (unsigned char const value : query.oids(*this)) {
            auto const tid = static_cast<unsigned char>(value + base);
            addSupportedTid(location, tid);
            found.push_back(tid);
        }
    }
    return result;
}

// A module that reports no test at all has the ten of the standard.
bool Ecu::detectFirstTestIdentifiers(OxygenSensorLocation location, std::vector<unsigned char>& found)
{
    Service05Oids query(0, oxygenSensorByte(location));
    if (!succeeds(query)) {
        TERVEX_LOG(Fatal) << "Failed to get supported 05 TIDs 0x01 - 0x20";
        return false;
    }
    std::vector<unsigned char> tids = query.oids(*this);
    if (tids.empty()) {
        tervex::TraceStream << "No supported TIDs reported for ECU " << lowerHex(m_id);
        tids.resize(standardTests);
        std::iota(tids.begin(), tids.end(), static_cast<unsigned char>(1));
    } else {
        found.insert(found.end(), tids.begin(), tids.end());
    }
    addSupportedTids(location, tids);
    return true;
}

} // namespace obd
