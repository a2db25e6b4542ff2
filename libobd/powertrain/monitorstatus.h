#pragma once

#include <obd/powertrainparameter.h>

#include <iterator>
#include <map>
#include <mutex>
#include <optional>

namespace obd {

// Readiness monitors of PIDs 0x01 and 0x41 (SAE J1979). The monitors 4 to 11 are those of spark ignition engines, 12 to
// 17 those of compression ignition engines, which read the same bits.
enum ReadinessMonitorTest : int
{
    ReadinessMisfire = 0,
    ReadinessFuelSystem = 1,
    ReadinessComprehensiveComponent = 2,
    ReadinessIgnitionBit = 3, // tells the ignition type, is no monitor
    ReadinessCatalyst = 4,
    ReadinessHeatedCatalyst = 5,
    ReadinessEvaporativeSystem = 6,
    ReadinessSecondaryAirSystem = 7,
    ReadinessGasolineParticulateFilter = 8,
    ReadinessOxygenSensor = 9,
    ReadinessOxygenSensorHeater = 10,
    ReadinessEgrVvtSystem = 11,
    ReadinessNmhcCatalyst = 12,
    ReadinessNoxAftertreatment = 13,
    ReadinessBoostPressure = 14,
    ReadinessExhaustGasSensor = 15,
    ReadinessPmFilter = 16,
    ReadinessEgrVvtSystemCompression = 17,
};

// The two bits of a readiness monitor in the word of PIDs 0x01 and 0x41. Bit 31 is the top bit of byte A.
struct MonitorTestInfo
{
    ReadinessMonitorTest test;
    unsigned int availableBit;
    unsigned int completeBit; // set while the monitor is NOT complete
};

// What PIDs 0x01 and 0x41 share: one 32 bit word a control module. Delivers no sensor values; services ask single
// questions. The words are guarded: the keep-alive's object is fed on the worker thread for as long as a connection
// stands, whoever reads it.
class MonitorStatusWord : public PowertrainParameter
{
public:
    static constexpr MonitorTestInfo TEST_INFO_ARRAY[] = {
        {ReadinessMisfire, 16, 20},
        {ReadinessFuelSystem, 17, 21},
        {ReadinessComprehensiveComponent, 18, 22},
        {ReadinessIgnitionBit, 19, 23},
        {ReadinessCatalyst, 8, 0},
        {ReadinessHeatedCatalyst, 9, 1},
        {ReadinessEvaporativeSystem, 10, 2},
        {ReadinessSecondaryAirSystem, 11, 3},
        {ReadinessGasolineParticulateFilter, 12, 4},
        {ReadinessOxygenSensor, 13, 5},
        {ReadinessOxygenSensorHeater, 14, 6},
        {ReadinessEgrVvtSystem, 15, 7},
        {ReadinessNmhcCatalyst, 8, 0},
        {ReadinessNoxAftertreatment, 9, 1},
        {ReadinessBoostPressure, 11, 3},
        {ReadinessExhaustGasSensor, 13, 5},
        {ReadinessPmFilter, 14, 6},
        {ReadinessEgrVvtSystemCompression, 15, 7},
    };
    static constexpr std::size_t TEST_INFO_ARRAY_SIZE = std::size(TEST_INFO_ARRAY);
    static_assert(TEST_INFO_ARRAY_SIZE == 18);

    unsigned int timeout() const override; // 2500 ms
    void clear() override;
    ParameterIdentifier::Id pid() const override;
    std::string description(IEcu const& ecu) override;
    std::vector<std::shared_ptr<SensorInfo const>> sensorInfo(IEcu const& ecu) override;
    std::vector<std::shared_ptr<SensorValue>> values(IEcu const& ecu, UnitSystem system) override; // none

protected:
    MonitorStatusWord(unsigned char pid, std::string const& description);

    bool fromPayload(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& payload) override;

    // Fields of the module's word; 0 and false without one, and for a test that is not in the table.
    unsigned int word(IEcu const& ecu) const;
    bool isAvailableBitSet(IEcu const& ecu, ReadinessMonitorTest test) const;
    bool isAvailableAndComplete(IEcu const& ecu, ReadinessMonitorTest test) const;

private:
    std::shared_ptr<SensorInfo const> m_info;
    mutable std::mutex m_mutex;
    std::map<unsigned int, unsigned int> m_words; // by module id; protected by m_mutex
};

// PID 0x01: the state since the trouble codes were last cleared. Without a reading every question answers as if all
// bits were clear.
class MonitorStatus : public MonitorStatusWord
{
public:
    MonitorStatus();

    unsigned int getNumberOfErrors(IEcu const& ecu) const; // stored trouble codes, 0 to 127
    bool isMalfunctionIndicatorLightOn(IEcu const& ecu) const;
    IgnitionType getIgnitionType(IEcu const& ecu) const;
    bool isTestAvailable(IEcu const& ecu, ReadinessMonitorTest test) const;
    // False as well for a monitor that the vehicle does not have.
    bool isTestComplete(IEcu const& ecu, ReadinessMonitorTest test) const;
};

// PID 0x41: the state in the present driving cycle.
class MonitorStatusThisCycle : public MonitorStatusWord
{
public:
    MonitorStatusThisCycle();

    bool isTestEnabled(IEcu const& ecu, ReadinessMonitorTest test) const;
    // False as well for a monitor that is not enabled.
    bool isTestComplete(IEcu const& ecu, ReadinessMonitorTest test) const;
};

} // namespace obd
