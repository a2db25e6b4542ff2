#include "libobd/parameters/performancetracking.h"

#include "libobd/bytes/bytes.h"
#include "libobd/parameters/replychecks.h"
#include "libobd/parameters/saelines.h"

#include <common/logrecord.h>

#include <iterator>

namespace obd {
namespace {

constexpr std::size_t canMinimumLength = 35; // with the 16 counters that SAE J1979 asks for at least

} // namespace

PerformanceTracking::PerformanceTracking(unsigned char infoType, std::span<CounterText const> texts)
    : VehicleInformation(infoType), m_texts(texts)
{}

void PerformanceTracking::clear()
{
    m_counters.clear();
}

std::string PerformanceTracking::counterDescription(int counter) const
{
    for (CounterText const& row : m_texts) {
        if (row.counter == counter) {
            return row.text;
        }
    }
    TERVEX_LOG(Error) << "Invalid counter: " << counter;
    return {};
}

unsigned int PerformanceTracking::counterValue(IEcu const& ecu, int counter) const
{
    Counters const* const counters = findOrLog(m_counters, ecu);
    if (counters == nullptr) {
        return 0;
    }
    auto const found = counters->find(counter);
    if (found == counters->end()) {
        TERVEX_LOG(Error) << "Invalid counter: " << counter;
        return 0;
    }
    return found->second;
}

std::vector<int> PerformanceTracking::counters(IEcu const& ecu) const
{
    std::vector<int> numbers;
    for (auto const& entry : findOrEmpty(m_counters, ecu)) {
        numbers.push_back(entry.first);
    }
    return numbers;
}

bool PerformanceTracking::fromCanSystem(unsigned int ecuId, std::vector<unsigned char> const& data)
{
    if (data.size() < canMinimumLength) {
        return refuseLength(data);
    }
    Counters counters;
    for (std::size_t index = 0; infoHeaderLength + 2 * index + 1 < data.size(); ++index) {
        store(counters, index, readUint16(data, infoHeaderLength + 2 * index));
    }
    m_counters[ecuId] = std::move(counters);
    return true;
}

bool PerformanceTracking::fromSaeSystem(unsigned int ecuId, std::vector<unsigned char> const& data)
{
    std::optional<SaeLines> const lines = saeLines(data);
    if (!lines) {
        return false;
    }
    Counters counters;
    for (std::size_t line = 0; line < lines->count(); ++line) {
        store(counters, 2 * line, lines->word(line, 3));
        store(counters, 2 * line + 1, lines->word(line, 5));
    }
    m_counters[ecuId] = std::move(counters);
    return true;
}

void PerformanceTracking::store(Counters& counters, std::size_t index, unsigned int value) const
{
    if (index < m_texts.size() && value != 0) {
        counters[m_texts[index].counter] = value;
    }
}

PerformanceTracking::CounterText const PerformanceTrackingSpark::texts[] = {
    {ObdConditionsEncountered, "OBD Monitoring Conditions Encountered Counts"},
    {IgnitionCycles, "Ignition Cycle Counter"},
    {CatalystCompletedBank1, "Catalyst Monitor Completion Counts Bank 1"},
    {CatalystEncounteredBank1, "Catalyst Monitor Conditions Encountered Counts Bank 1"},
    {CatalystCompletedBank2, "Catalyst Monitor Completion Counts Bank 2"},
    {CatalystEncounteredBank2, "Catalyst Monitor Conditions Encountered Counts Bank 2"},
    {OxygenSensorCompletedBank1, "O2 Sensor Monitor Completion Counts Bank 1"},
    {OxygenSensorEncounteredBank1, "O2 Sensor Monitor Conditions Encountered Counts Bank 1"},
    {OxygenSensorCompletedBank2, "O2 Sensor Monitor Completion Counts Bank 2"},
    {OxygenSensorEncounteredBank2, "O2 Sensor Monitor Conditions Encountered Counts Bank 2"},
    {EgrVvtCompleted, "EGR and/or VVT Monitor Completion Condition Counts"},
    {EgrVvtEncountered, "EGR and/or VVT Monitor Conditions Encountered Counts"},
    {SecondaryAirCompleted, "AIR Monitor Completion Condition Counts (Secondary Air)"},
    {SecondaryAirEncountered, "AIR Monitor Conditions Encountered Counts (Secondary Air)"},
    {EvapCompleted, "EVAP Monitor Completion Condition Counts"},
    {EvapEncountered, "EVAP Monitor Conditions Encountered Counts"},
    {SecondaryOxygenSensorCompletedBank1, "Secondary O2 Sensor Monitor Completion Counts Bank 1"},
    {SecondaryOxygenSensorEncounteredBank1, "Secondary O2 Sensor Monitor Conditions Encountered Counts Bank 1"},
    {SecondaryOxygenSensorCompletedBank2, "Secondary O2 Sensor Monitor Completion Counts Bank 2"},
    {SecondaryOxygenSensorEncounteredBank2, "Secondary O2 Sensor Monitor Conditions Encountered Counts Bank 2"},
    {AirFuelRatioImbalanceCompletedBank1, "Air Fuel Ratio Imbalance Monitor Completion Counts Bank 1"},
    {AirFuelRatioImbalanceEncounteredBank1, "Air Fuel Ratio Imbalance Monitor Conditions Encountered Counts Bank 1"},
    {AirFuelRatioImbalanceCompletedBank2, "Air Fuel Ratio Imbalance Monitor Completion Counts Bank 2"},
    // Says bank 1 on purpose: lists are matched by the wording of these texts, so it stays.
    {AirFuelRatioImbalanceEncounteredBank2, "Air Fuel Ratio Imbalance Monitor Conditions Encountered Counts Bank 1"},
    {ParticulateFilterCompletedBank1, "Particulate Filter Monitor Completion Counts Bank 1"},
    {ParticulateFilterEncounteredBank1, "Particulate Filter Monitor Conditions Encountered Counts Bank 1"},
    {ParticulateFilterCompletedBank2, "Particulate Filter Monitor Completion Counts Bank 2"},
    {ParticulateFilterEncounteredBank2, "Particulate Filter Monitor Conditions Encountered Counts Bank 2"},
};

PerformanceTrackingSpark::PerformanceTrackingSpark() : PerformanceTracking(0x08, texts)
{
    static_assert(std::size(texts) == ParticulateFilterEncounteredBank2 + 1);
}

PerformanceTracking::CounterText const PerformanceTrackingCompression::texts[] = {
    {ObdConditionsEncountered, "OBD Monitoring Conditions Encountered Counts"},
    {IgnitionCycles, "Ignition Cycle Counter"},
    {NmhcCatalystCompleted, "NMHC Catalyst Monitor Completion Condition Counts"},
    {NmhcCatalystEncountered, "NMHC Catalyst Monitor Conditions Encountered Counts"},
    {NoxCatalystCompleted, "NOx Catalyst Monitor Completion Condition Counts"},
    {NoxCatalystEncountered, "NOx Catalyst Monitor Conditions Encountered Counts"},
    {NoxAdsorberCompleted, "NOx Adsorber Monitor Completion Conditions Counts"},
    {NoxAdsorberEncountered, "NOx Adsorber Monitor Conditions Encountered Counts"},
    {PmFilterCompleted, "PM Filter Monitor Completion Condition Counts"},
    {PmFilterEncountered, "PM Filter Monitor Conditions Encountered Counts"},
    {ExhaustGasSensorCompleted, "Exhaust Gas Sensor Monitor Completion Condition Counts"},
    {ExhaustGasSensorEncountered, "Exhaust Gas Sensor Monitor Conditions Encountered Counts"},
    {EgrVvtCompleted, "EGR and/or VVT Monitor Completion Condition Counts"},
    {EgrVvtEncountered, "EGR and/or VVT Monitor Conditions Encountered Counts"},
    {BoostPressureCompleted, "Boost Pressure Monitor Completion Condition Counts"},
    {BoostPressureEncountered, "Boost Pressure Monitor Conditions Encountered Counts"},
    {FuelCompleted, "Fuel Monitor Completion Condition Counts"},
    {FuelEncountered, "Fuel Monitor Conditions Encountered Counts"},
};

PerformanceTrackingCompression::PerformanceTrackingCompression() : PerformanceTracking(0x0B, texts)
{
    static_assert(std::size(texts) == FuelEncountered + 1);
}

} // namespace obd
