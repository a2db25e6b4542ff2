#pragma once

#include "libvelmora/report/vehiclereport.h"

#include <velmora/document.h>

#include <cstdint>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

// "us-epa" and so on.
char const* inspectionKey(InspectionRule rule);

struct InspectionWish
{
    InspectionRule rule = InspectionRule::None;
    std::optional<int> modelYear; // as given; else that of the VIN counts, where it is sure
};

// What the data suggests for the OBD part of an inspection.
struct InspectionReport
{
    enum class Verdict : std::uint8_t
    {
        Unknown,
        Ready,
        NotReady,
    };

    InspectionRule rule;
    std::string name;
    std::string date; // of the rule, as far as it is known here
    std::optional<int> modelYear;
    bool yearByVin = false;
    Verdict verdict = Verdict::Unknown;
    std::vector<std::string> reasons;
    std::vector<std::string> notes;
};

// wish.rule must not be None. thisYear: no model year lies more than a year behind it.
InspectionReport inspect(VehicleReport const& report, InspectionWish const& wish, int thisYear);

Json toJsonValue(InspectionReport const& report);

} // namespace velmora
