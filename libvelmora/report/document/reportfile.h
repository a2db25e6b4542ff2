#pragma once

#include "libvelmora/report/document/reportdocument.h"

#include <string>

namespace velmora {

// In which form a report is written, by the ending of its file.
enum class ReportForm
{
    Html,
    Markdown,
    Data, // JSON
    Text,
};

// The form of a file's name. Throws Error (wrong use) for an ending that names none.
ReportForm reportFormOf(std::string const& path);

// Throws Error for a file whose ending names no form, or that stands already, unless replace.
void checkReportPath(std::string const& path, bool replace);

// Writes a report whole. text is what the Text form is to hold. Throws Error for a file that stands already, unless
// replace, and for one that can't be written.
void writeReport(std::string const& path, VehicleReport const& report, ReportFacts const& facts,
                 std::string const& text, bool replace);

// The report with each VIN as facts want it shown.
VehicleReport withShownVins(VehicleReport report, ReportFacts const& facts);

} // namespace velmora
