#pragma once

#include "libobd/parameters/vehicleinformation.h"

#include <map>
#include <span>
#include <string>

namespace obd {

// In-use performance tracking of service 09: how often each monitor could run and did. A counter that reads 0 is taken
// as not kept by the module and stands in no list. A new reply replaces all counters of its module.
class PerformanceTracking : public VehicleInformation
{
public:
    void clear() override;

    // The name for display; empty, with a log line, for a number that is no counter.
    std::string counterDescription(int counter) const;

    // 0, with a log line, for a module that did not answer and for a counter that stands in no list.
    unsigned int counterValue(IEcu const& ecu, int counter) const;

    // The counters that the module reported, in rising order; empty for one that did not answer.
    std::vector<int> counters(IEcu const& ecu) const;

protected:
    struct CounterText
    {
        int counter;
        char const* text;
    };

    // texts: one row a counter, in the order in which replies carry them; must live as long as the program.
    PerformanceTracking(unsigned char infoType, std::span<CounterText const> texts);

private:
    using Counters = std::map<int, unsigned int>;

    bool fromCanSystem(unsigned int ecuId, std::vector<unsigned char> const& data) override;
    bool fromSaeSystem(unsigned int ecuId, std::vector<unsigned char> const& data) override;
    void store(Counters& counters, std::size_t index, unsigned int value) const;

    std::span<CounterText const> m_texts;
    std::map<unsigned int, Counters> m_counters; // by module id
};

// The counters of spark ignition engines (info type 08).
class PerformanceTrackingSpark : public PerformanceTracking
{
public:
    enum Counter : int
    {
        ObdConditionsEncountered = 0,
        IgnitionCycles,
        CatalystCompletedBank1,
        CatalystEncounteredBank1,
        CatalystCompletedBank2,
        CatalystEncounteredBank2,
        OxygenSensorCompletedBank1,
        OxygenSensorEncounteredBank1,
        OxygenSensorCompletedBank2,
        OxygenSensorEncounteredBank2,
        EgrVvtCompleted,
        EgrVvtEncountered,
        SecondaryAirCompleted,
        SecondaryAirEncountered,
        EvapCompleted,
        EvapEncountered,
        SecondaryOxygenSensorCompletedBank1,
        SecondaryOxygenSensorEncounteredBank1,
        SecondaryOxygenSensorCompletedBank2,
        SecondaryOxygenSensorEncounteredBank2,
        AirFuelRatioImbalanceCompletedBank1,
        AirFuelRatioImbalanceEncounteredBank1,
        AirFuelRatioImbalanceCompletedBank2,
        AirFuelRatioImbalanceEncounteredBank2,
        ParticulateFilterCompletedBank1,
        ParticulateFilterEncounteredBank1,
        ParticulateFilterCompletedBank2,
        ParticulateFilterEncounteredBank2,
    };

    PerformanceTrackingSpark();

private:
    static CounterText const texts[];
};

// The counters of compression ignition engines (info type 0B).
class PerformanceTrackingCompression : public PerformanceTracking
{
public:
    enum Counter : int
    {
        ObdConditionsEncountered = 0,
        IgnitionCycles,
        NmhcCatalystCompleted,
        NmhcCatalystEncountered,
        NoxCatalystCompleted,
        NoxCatalystEncountered,
        NoxAdsorberCompleted,
        NoxAdsorberEncountered,
        PmFilterCompleted,
        PmFilterEncountered,
        ExhaustGasSensorCompleted,
        ExhaustGasSensorEncountered,
        EgrVvtCompleted,
        EgrVvtEncountered,
        BoostPressureCompleted,
        BoostPressureEncountered,
        FuelCompleted,
        FuelEncountered,
    };

    PerformanceTrackingCompression();

private:
    static CounterText const texts[];
};

} // namespace obd
