#include "libvelmora/report/finding/findingparts.h"
#include "libvelmora/report/texts/findingtexts.h"

#include <fmt/format.h>

#include <algorithm>
#include <cmath>

namespace velmora {

namespace {

constexpr double trimAwayPercent = 10;
constexpr double trimFarPercent = 25;
constexpr double warmCelsius = 70;
constexpr double hotCelsius = 115;
constexpr double untoldCelsius = -40; // a sensor that is not there reads so
constexpr double coldWeatherCelsius = -7;
constexpr double longRunSeconds = 900;
constexpr double lowestRunningVolts = 13.0;
constexpr double highestRunningVolts = 15.0;
constexpr double lowestStandingVolts = 12.0;
constexpr double highestCarVolts = 18.0; // above it there are two batteries in a row

double lowestSample(LiveValue const& value)
{
    return *std::min_element(value.samples.begin(), value.samples.end());
}

double highestSample(LiveValue const& value)
{
    return *std::max_element(value.samples.begin(), value.samples.end());
}

LiveValue const* sampled(ModuleReport const& module, unsigned int pid)
{
    LiveValue const* const value = findValue(module, pid);
    return value != nullptr && !value->samples.empty() ? value : nullptr;
}

bool isClosedLoop(ModuleReport const& module)
{
    LiveValue const* const system = findValue(module, 0x03);
    return system != nullptr && system->value.starts_with("Closed loop");
}

// The smallest of the sums of short and long term trim, by size; nothing if they do not lie to one side.
std::optional<double> lastingTrim(ModuleReport const& module, unsigned int shortTerm, unsigned int longTerm)
{
    LiveValue const* const quick = sampled(module, shortTerm);
    LiveValue const* const slow = sampled(module, longTerm);
    if (quick == nullptr || slow == nullptr || quick->samples.size() < 2 ||
        quick->samples.size() != slow->samples.size()) {
        return std::nullopt;
    }
    std::optional<double> least;
    for (std::size_t i = 0; i < quick->samples.size(); ++i) {
        double const sum = quick->samples[i] + slow->samples[i];
        if (least && (sum < 0.0) != (*least < 0.0)) {
            return std::nullopt;
        }
        least = !least || std::abs(sum) < std::abs(*least) ? sum : *least;
    }
    return least;
}

struct BankTrim
{
    int bank;
    std::optional<double> percent;
};

std::vector<Evidence> trimEvidence(ModuleReport const& module, bool bothBanks)
{
    std::vector<Evidence> list = {
        {DataTopic::Values, module.id, fmt::format(texts::finding::trimSum, sampled(module, 0x06)->samples.size())},
        {DataTopic::Values, module.id, fmt::format(texts::finding::trimWarm, shownValue(module, 0x05))}};
    if (bothBanks) {
        list.push_back({DataTopic::Values, module.id, texts::finding::trimBoth});
    }
    return list;
}

void addTrim(std::vector<Finding>& list, ModuleReport const& module, BankTrim const& trim, bool bothBanks)
{
    double const size = std::abs(*trim.percent);
    bool const far = size > trimFarPercent;
    char const* const words = far ? texts::finding::trimFar : texts::finding::trimAway;
    std::string const number = fmt::format("{:.1f}", size);
    std::string text = *trim.percent > 0.0 ? fmt::format(texts::finding::trimAdds, number, trim.bank, words)
                                           : fmt::format(texts::finding::trimTakes, number, trim.bank, words);
    list.push_back({far ? Severity::Warning : Severity::Note,
                    nameOf(module),
                    texts::finding::fuelTrim,
                    std::move(text),
                    "fuel-trim",
                    trimEvidence(module, bothBanks),
                    {texts::finding::trimElse}});
}

bool isAway(BankTrim const& trim)
{
    return trim.percent && std::abs(*trim.percent) > trimAwayPercent;
}

void addModuleTrims(std::vector<Finding>& list, ModuleReport const& module)
{
    LiveValue const* const coolant = sampled(module, 0x05);
    if (!isClosedLoop(module) || coolant == nullptr || lowestSample(*coolant) < warmCelsius) {
        return;
    }
    BankTrim const first{1, lastingTrim(module, 0x06, 0x07)};
    BankTrim const second{2, lastingTrim(module, 0x08, 0x09)};
    bool const both = isAway(first) && isAway(second) && (*first.percent < 0.0) == (*second.percent < 0.0);
    for (BankTrim const& trim : {first, second}) {
        if (isAway(trim)) {
            addTrim(list, module, trim, both);
        }
    }
}

void addCold(std::vector<Finding>& list, ModuleReport const& module, LiveValue const& coolant)
{
    std::optional<double> const runTime = numberOf(module, 0x1F);
    std::optional<double> const ambient = numberOf(module, 0x46);
    if (!runTime || *runTime < longRunSeconds || highestSample(coolant) >= warmCelsius ||
        highestSample(coolant) <= untoldCelsius || (ambient && *ambient <= coldWeatherCelsius)) {
        return;
    }
    Finding finding{Severity::Warning,
                    nameOf(module),
                    texts::finding::thermostat,
                    texts::finding::coldText,
                    "coolant-not-warm",
                    {{DataTopic::Values, module.id, fmt::format(texts::finding::coolantAt, shownValue(module, 0x05))},
                     {DataTopic::Values, module.id, fmt::format(texts::finding::ranFor, shownValue(module, 0x1F))}},
                    {texts::finding::coldElse}};
    if (ambient) {
        finding.evidence.push_back(
            {DataTopic::Values, module.id, fmt::format(texts::finding::ambientAt, shownValue(module, 0x46))});
    } else {
        finding.otherwise.emplace_back(texts::finding::ambientUntold);
    }
    list.push_back(std::move(finding));
}

void addHot(std::vector<Finding>& list, ModuleReport const& module, LiveValue const& coolant)
{
    if (lowestSample(coolant) > hotCelsius) {
        list.push_back(
            {Severity::Warning,
             nameOf(module),
             texts::finding::coolantHot,
             texts::finding::hotText,
             "coolant-hot",
             {{DataTopic::Values, module.id, fmt::format(texts::finding::coolantAt, shownValue(module, 0x05))}},
             {texts::finding::hotElse}});
    }
}

// The engine speed of the module that tells it; nothing if none does.
LiveValue const* engineSpeed(VehicleReport const& report)
{
    for (ModuleReport const& module : report.modules) {
        if (LiveValue const* const speed = sampled(module, 0x0C)) {
            return speed;
        }
    }
    return nullptr;
}

struct VoltageSpan
{
    double low;
    double high;
    std::string module;
    Evidence evidence;
};

// By a module where one tells it, for adapters are off by up to half a volt.
std::optional<VoltageSpan> voltageOf(VehicleReport const& report)
{
    for (ModuleReport const& module : report.modules) {
        if (LiveValue const* const volts = sampled(module, 0x42)) {
            return VoltageSpan{lowestSample(*volts), highestSample(*volts), nameOf(module),
                               Evidence{DataTopic::Values, module.id,
                                        fmt::format(texts::finding::voltsModule, volts->value, volts->samples.size())}};
        }
    }
    if (!report.adapter.volts) {
        return std::nullopt;
    }
    double const volts = *report.adapter.volts;
    return VoltageSpan{volts, volts, texts::finding::adapter,
                       Evidence{DataTopic::Adapter, 0, fmt::format(texts::finding::voltsAdapter, volts)}};
}

void addVoltage(std::vector<Finding>& list, VoltageSpan const& span, bool running, char const* text)
{
    Evidence engine = span.evidence;
    engine.text = running ? texts::finding::engineRuns : texts::finding::engineStands;
    list.push_back({Severity::Warning,
                    span.module,
                    texts::finding::voltage,
                    text,
                    "voltage",
                    {span.evidence, engine},
                    {running ? texts::finding::chargeElse : texts::finding::standElse}});
}

} // namespace

void addFuelTrims(std::vector<Finding>& list, VehicleReport const& report)
{
    for (ModuleReport const& module : report.modules) {
        addModuleTrims(list, module);
    }
}

void addTemperatures(std::vector<Finding>& list, VehicleReport const& report)
{
    for (ModuleReport const& module : report.modules) {
        if (LiveValue const* const coolant = sampled(module, 0x05)) {
            addCold(list, module, *coolant);
            addHot(list, module, *coolant);
        }
    }
}

void addVoltages(std::vector<Finding>& list, VehicleReport const& report)
{
    LiveValue const* const speed = engineSpeed(report);
    std::optional<VoltageSpan> const span = voltageOf(report);
    if (speed == nullptr || !span || span->high > highestCarVolts) {
        return;
    }
    bool const runs = lowestSample(*speed) > 0.0;
    bool const stands = highestSample(*speed) <= 0.0;
    if (runs && span->high < lowestRunningVolts) {
        addVoltage(list, *span, true, texts::finding::lowRunning);
    } else if (runs && span->low > highestRunningVolts) {
        addVoltage(list, *span, true, texts::finding::highRunning);
    } else if (stands && span->high < lowestStandingVolts) {
        addVoltage(list, *span, false, texts::finding::lowStanding);
    }
}

} // namespace velmora
