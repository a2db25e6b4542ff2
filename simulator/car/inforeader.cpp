#include "simulator/car/inforeader.h"

#include <algorithm>

namespace obdsim {

namespace {

Bytes readVerification(TableReader& table, std::string const& text)
{
    constexpr std::size_t size = 4;
    auto const value = parseHex(text);
    if (!value || value->size() != size) {
        table.fail("verifications", "a calibration verification number is four bytes");
    }
    return *value;
}

/// "ECM-EngineControl": the acronym fills four bytes, the dash is the fifth.
std::string layOutName(std::string const& text)
{
    constexpr std::size_t acronymSize = 4;
    std::string acronym = text.substr(0, text.find('-'));
    std::string const rest = text.substr(acronym.size());
    acronym.resize(std::max(acronymSize, acronym.size()), '\0');
    return acronym + rest;
}

void checkLength(TableReader& table, std::string_view key, std::string const& text, std::size_t most)
{
    if (text.size() > most) {
        table.fail(key, "\"" + std::string(key) + "\" is longer than " + std::to_string(most) + " characters");
    }
}

} // namespace

VehicleInfo readInfo(TableReader& table)
{
    constexpr std::size_t numberSize = 17;
    constexpr std::size_t calibrationSize = 16;
    constexpr std::size_t nameSize = 20;
    VehicleInfo info;
    info.vin = table.text("vin", "");
    info.serial = table.text("serial", "");
    info.typeApproval = table.text("type_approval", "");
    info.ecuName = layOutName(table.text("ecu_name", ""));
    info.calibrations = table.texts("calibrations");
    for (auto const& text : table.texts("verifications")) {
        info.verifications.push_back(readVerification(table, text));
    }
    info.sparkCounters = table.words("spark_counters");
    info.compressionCounters = table.words("compression_counters");
    checkLength(table, "vin", info.vin, numberSize);
    checkLength(table, "serial", info.serial, numberSize);
    checkLength(table, "type_approval", info.typeApproval, numberSize);
    checkLength(table, "ecu_name", info.ecuName, nameSize);
    for (auto const& calibration : info.calibrations) {
        checkLength(table, "calibrations", calibration, calibrationSize);
    }
    return info;
}

} // namespace obdsim
