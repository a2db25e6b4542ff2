#pragma once

#include "libvelmora/report/codereport.h"
#include "libvelmora/report/countersreport.h"
#include "libvelmora/report/freezereport.h"
#include "libvelmora/report/inforeport.h"
#include "libvelmora/report/monitorsreport.h"
#include "libvelmora/report/oxygenreport.h"
#include "libvelmora/report/readinessreport.h"

#include <optional>
#include <string>
#include <vector>

namespace velmora {

// What a scan finds, ready to be shown; no bus work here. Empty texts and missing values were not told.
struct AdapterReport
{
    std::string device; // name and version
    std::string description;
    std::string identification;
    std::optional<float> volts;
};

struct ProtocolReport
{
    std::optional<int> number; // the adapter's, 1 to 9
    std::string name;          // the adapter's words
};

struct ModuleReport
{
    unsigned int id;
    std::string name;
    std::vector<unsigned int> supported; // identifiers of service 01 that are sensors
    InfoReport info;
    CodeReport codes;
    FreezeReport freeze;
    ReadinessReport readiness;
    MonitorsReport monitors;
    OxygenReport oxygen;
    CountersReport counters;
};

struct VehicleReport
{
    AdapterReport adapter;
    ProtocolReport protocol;
    std::vector<ModuleReport> modules; // in rising order of id
};

// The document that docs/json.md describes.
std::string toJson(VehicleReport const& report);

} // namespace velmora
