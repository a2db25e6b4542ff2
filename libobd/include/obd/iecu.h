#pragma once

#include <obd/ignitiontype.h>
#include <obd/obdmode.h>
#include <obd/obdprotocol.h>
#include <obd/outcome.h>
#include <obd/oxygensensorlocation.h>

#include <string>
#include <vector>

namespace obd {

/// The value of PID 0x1C as the vehicle reported it, 0 while unknown.
using ObdStandard = int;

/// What the library knows of one control module. Read from any thread once the connection stands; detection of freeze
/// frames goes to the bus and blocks.
class IEcu
{
public:
    virtual ~IEcu() = default;

    /// The id by which the whole library knows the module; see ResponseMap.
    virtual unsigned int id() const = 0;

    /// Reads from the vehicle which PIDs the freeze frame holds, once for each frame. False if it did not answer.
    virtual bool detectFreezeFrameConfiguration(unsigned char frame) = 0;
    /// Forgets all freeze frames, to be read again.
    virtual void resetFreezeFrameConfiguration() = 0;

    /// The identifiers that the module supports in a service, in the order of their arrival, the range markers 0x00,
    /// 0x20 and so on among them. Empty for a service or a frame that is not known. frame counts in service 2 only.
    virtual std::vector<unsigned char> supportedIds(ObdMode mode, unsigned char frame) const = 0;
    /// Whether the sensor has that service 05 test.
    virtual bool isSupported(OxygenSensorLocation location, unsigned char tid) const = 0;
    /// Whether supportedIds has it.
    virtual bool isSupported(ObdMode mode, unsigned char id, unsigned char frame) const = 0;
    /// The service 05 tests of a sensor.
    virtual std::vector<unsigned char> supportedTids(OxygenSensorLocation location) const = 0;

    virtual ObdProtocol protocol() const = 0;            ///< the bus family
    virtual std::string protocolDescription() const = 0; ///< of the bus
    virtual ObdStandard standard() const = 0;            ///< that the module reports to meet
    virtual std::string standardDescription() const = 0; ///< such as "EOBD"
    /// Short name, such as "ECM", or "ECU#1" where the module tells none.
    virtual std::string name() const = 0;
    /// Long name, or "Control Module 0x7E8".
    virtual std::string description() const = 0;

    virtual OxygenSensorBank oxygenSensorBanks() const = 0; ///< the arrangement of its oxygen sensors
    virtual std::vector<OxygenSensorLocation> oxygenSensorLocations() const = 0; ///< the oxygen sensors it has

    /// Upper ends of ranges that the module tells in PIDs 0x4F and 0x50, or the standard's defaults.
    virtual unsigned int equivalenceRatioMax() const = 0;
    virtual unsigned int oxygenSensorVoltageMax() const = 0;            ///< V
    virtual unsigned int oxygenSensorCurrentMax() const = 0;            ///< mA
    virtual unsigned int intakeManifoldAbsolutePressureMax() const = 0; ///< kPa
    virtual double airFlowRateMax() const = 0;                          ///< g/s

    virtual IgnitionType ignitionType() const = 0; ///< that the module reports

    /// How asking the module for its supported set of a service went: only where it was answered is what is missing in
    /// the set also missing in the module. ModuleSilent or worse also if the reply of a later range is what is missing;
    /// NotOffered for what was never asked. frame counts in service 2 only.
    virtual Verdict detection(ObdMode /*mode*/, unsigned char /*frame*/) const { return {}; }
};

} // namespace obd
