#pragma once

#include <string>
#include <utility>

namespace obd {

/// One meaning of a diagnostic trouble code (SAE J2012). The library shares such objects between callers: read only.
struct DtcDataModel
{
    /// Fills all members.
    DtcDataModel(std::string codeText, std::string meaning, std::string systemName, std::string makerName)
        : code(std::move(codeText)), description(std::move(meaning)), system(std::move(systemName)),
          manufacturer(std::move(makerName))
    {}

    /// With nobody as its maker.
    DtcDataModel(std::string codeText, std::string meaning, std::string systemName)
        : DtcDataModel(std::move(codeText), std::move(meaning), std::move(systemName), {})
    {}

    std::string code;         ///< such as "P0420"
    std::string description;  ///< what the code means
    std::string system;       ///< "Powertrain", "Body", "Chassis", "Network" or "Undefined"
    std::string manufacturer; ///< whose meaning it is: "Generic", a maker, or "Unknown"
};

} // namespace obd
