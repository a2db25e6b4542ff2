#pragma once

#include "libvelmora/report/document/document.h"
#include "libvelmora/report/finding/inspection.h"
#include "libvelmora/report/vehiclereport.h"

#include <string>

namespace velmora {

// What the vehicle does not tell of a report.
struct ReportFacts
{
    std::string date;    // as it is to be shown
    std::string port;    // where the adapter was
    std::string version; // of the program
    bool maskVin = false;
    int year = 0; // of the date; no model year lies more than one behind it
    InspectionWish inspection = {};
    std::string vehicle = {}; // the owner's name of it, may be empty
};

// The whole report: vehicle and findings first, then each control module with all that it told, then how it was read.
ReportDocument makeDocument(VehicleReport const& report, ReportFacts const& facts);

// The whole report for programs, with the inspection where one is wished for.
std::string reportJson(VehicleReport const& report, ReportFacts const& facts);

// One control module, with all its topics.
std::vector<DocumentSection> moduleSections(ModuleReport const& module, ReportFacts const& facts);

// The VIN as the report shows it: with its last six characters, which name the single car, as zeros if that is wanted.
std::string shownVin(std::string const& vin, bool mask);

} // namespace velmora
