#include "libobd/parameters/identificationnumber.h"

namespace obd {
namespace {

constexpr std::size_t vehicleNumberLength = 20;

} // namespace

IdentificationNumber::IdentificationNumber(unsigned char infoType)
    : VehicleInformation(infoType), m_parser({0x49, infoType}, vehicleNumberLength)
{}

unsigned int IdentificationNumber::timeout() const
{
    return VehicleInformation::timeout() * 2;
}

void IdentificationNumber::clear()
{
    m_parser.clear();
}

bool IdentificationNumber::fromCanSystem(unsigned int ecuId, std::vector<unsigned char> const& data)
{
    return m_parser.fromCanSystem(ecuId, data);
}

bool IdentificationNumber::fromSaeSystem(unsigned int ecuId, std::vector<unsigned char> const& data)
{
    // A reply that has neither form exactly, such as one with bytes behind its last line, is read without checksums.
    bool const checksums = findSaeChecksumLength(data) == 1;
    return m_parser.fromSaeSystem(ecuId, data, checksums ? 1 : 0);
}

} // namespace obd
