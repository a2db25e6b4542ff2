#include "libvelmora/report/finding/findingparts.h"
#include "libvelmora/report/texts/findingtexts.h"
#include "libvelmora/vehicle/vin.h"

#include <fmt/format.h>

#include <algorithm>

namespace velmora {

namespace {

bool provesNothing(std::string const& verification)
{
    return verification.empty() || verification.find_first_not_of('0') == std::string::npos ||
           verification.find_first_not_of("Ff") == std::string::npos;
}

} // namespace

// Only numbers of the standard's form: what a swapped unit was never given is all zeros or filling.
void addDifferingVins(std::vector<Finding>& list, VehicleReport const& report)
{
    std::vector<Evidence> evidence;
    std::vector<std::string> names;
    std::vector<std::string> vins;
    for (ModuleReport const& module : report.modules) {
        std::string const& vin = module.info.vin;
        if (!isVin(vin) || vin.find_first_not_of('0') == std::string::npos) {
            continue;
        }
        names.push_back(nameOf(module));
        evidence.push_back({DataTopic::Info, module.id, fmt::format(texts::finding::vinOf, nameOf(module), vin)});
        vins.push_back(vin);
    }
    bool const differ =
        std::any_of(vins.begin(), vins.end(), [&vins](std::string const& each) { return each != vins.front(); });
    if (differ) {
        list.push_back({Severity::Warning,
                        fmt::format("{}", fmt::join(names, ", ")),
                        texts::finding::vinsDiffer,
                        texts::finding::vinText,
                        "vins-differ",
                        std::move(evidence),
                        {texts::finding::vinElse}});
    }
}

void addMissingVerification(std::vector<Finding>& list, VehicleReport const& report)
{
    for (ModuleReport const& module : report.modules) {
        std::vector<Evidence> evidence;
        for (InfoReport::Calibration const& each : module.info.calibrations) {
            if (!each.id.empty() && provesNothing(each.verification)) {
                evidence.push_back(
                    {DataTopic::Info, module.id,
                     fmt::format(texts::finding::verificationOf, each.id,
                                 each.verification.empty() ? texts::finding::verificationNone : each.verification)});
            }
        }
        if (!evidence.empty()) {
            list.push_back({Severity::Note,
                            nameOf(module),
                            texts::finding::noVerification,
                            texts::finding::verificationText,
                            "no-verification-number",
                            std::move(evidence),
                            {texts::finding::verificationElse}});
        }
    }
}

} // namespace velmora
