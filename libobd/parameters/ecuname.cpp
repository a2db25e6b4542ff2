#include "libobd/parameters/ecuname.h"

#include "libobd/parameters/bytetext.h"
#include "libobd/parameters/replychecks.h"
#include "libobd/parameters/saelines.h"

#include <common/logrecord.h>

#include <string_view>

namespace obd {
namespace {

constexpr std::size_t acronymLength = 4;
constexpr std::size_t nameLength = 15;
constexpr std::size_t fieldLength = acronymLength + 1 + nameLength; // with the delimiter between the two
constexpr std::size_t linesPerName = fieldLength / SaeLines::dataLength;

struct AcronymRow
{
    std::string_view shortForm;
    std::string_view longForm;
};

constexpr AcronymRow acronyms[] = {
    // in the order of search
    {"ABS", "Anti-Lock Brake System (ABS) Control Module"},
    {"AFC", "Alternative Fuel Control Module"},
    {"AHC", "Auxiliary Heater Control Module"},
    {"APC", "Air Pump Control Module"},
    {"AWD", "All Wheel Drive Control Module"},
    {"BCC", "Battery Charger Control Module"},
    {"BEC", "Battery Energy Control Module"},
    {"BSC", "Brake System Control Module"},
    {"CHC", "Chassis Control Module"},
    {"CRC", "Cruise Control Module"},
    {"CTC", "Coolant Temperature Control Module"},
    {"DCD", "DC/DC Converter Control Module"},
    {"DMC", "Drive Motor Control Module"},
    {"EAC", "Electric A/C Compressor Control Module"},
    {"EAM", "Exhaust Aftertreatment Control Module"},
    {"EBB", "Electronic Brake Boost Control Module"},
    {"ECC", "Emissions Critical Control Module"},
    {"ECM", "Engine Control Module"},
    {"FAC", "Fuel Additive Control Module"},
    {"FIC", "Fuel Injector Control Module"},
    {"FPC", "Fuel Pump Control Module"},
    {"4WD", "Four-Wheel Drive Clutch Control Module"},
    {"GPC", "Glow Plug Control Module"},
    {"GSM", "Gear Shift Control Module"},
    {"HVA", "HVAC Control Module"},
    {"HPC", "Hybrid Powertrain Control Module"},
    {"IPC", "Instrument Panel Cluster (IPC) Control Module"},
    {"PCM", "Powertrain Control Module"},
    {"RDC", "Reductant Control Module"},
    {"SGC", "Starter / Generator Control Module"},
    {"TAC", "Throttle Actuator Control Module"},
    {"TCC", "Transfer Case Control Module"},
    {"TCM", "Transmission Control Module"},
};

} // namespace

unsigned int EcuName::timeout() const
{
    return 2500;
}

void EcuName::clear()
{
    m_names.clear();
}

std::string EcuName::ecuAcronym(IEcu const& ecu) const
{
    Name const* const name = findOrLog(m_names, ecu);
    return name != nullptr ? name->acronym : std::string();
}

std::string EcuName::description(IEcu const& ecu) const
{
    Name const* const name = findOrLog(m_names, ecu);
    return name != nullptr ? name->text : std::string();
}

std::string EcuName::fullDescription(IEcu const& ecu) const
{
    std::string name = ecuAcronym(ecu);
    for (AcronymRow const& row : acronyms) {
        std::size_t const position = name.find(row.shortForm);
        if (position != std::string::npos) {
            return name.replace(position, row.shortForm.size(), row.longForm);
        }
    }
    return name;
}

bool EcuName::fromCanSystem(unsigned int ecuId, std::vector<unsigned char> const& data)
{
    if (data.size() < infoHeaderLength + fieldLength) {
        return refuseLength(data);
    }
    store(ecuId, slice(data, infoHeaderLength, fieldLength));
    return true;
}

bool EcuName::fromSaeSystem(unsigned int ecuId, std::vector<unsigned char> const& data)
{
    SaeLines const lines(data, guessChecksumLength(data));
    if (lines.count() < linesPerName) {
        return refuseLength(data);
    }
    if (!verifySaeSignature(data)) {
        return refuse("Invalid data received; signature mismatch");
    }
    std::vector<unsigned char> field(fieldLength);
    if (!assembleItem(lines, 0, field)) {
        return false;
    }
    store(ecuId, field);
    return true;
}

void EcuName::store(unsigned int ecuId, ByteView field)
{
    if (byteAt(field, acronymLength) != '-') {
        TERVEX_LOG(Error) << "No delimeter found!";
    }
    m_names[ecuId] = {compactText(slice(field, 0, acronymLength)),
                      compactText(slice(field, acronymLength + 1, nameLength))};
}

} // namespace obd
