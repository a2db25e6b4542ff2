#pragma once

#include <obd/iecu.h>

#include <map>
#include <string>
#include <vector>

namespace obd {

// Reads identification numbers, such as the VIN, out of replies and keeps them by control module. A number is at most
// 17 characters long; its module fills it up with zero bytes.
class IdentificationNumberParser
{
public:
    // signature: what a reply on CAN, and each line of one on the legacy buses, begins with. length: bytes of a whole
    // reply on CAN, and of the data of all lines together on the legacy buses.
    IdentificationNumberParser(std::vector<unsigned char> signature, std::size_t length);

    // False, with a log line and the module's number left alone, for a reply that can't be used.
    bool fromCanSystem(unsigned int ecuId, std::vector<unsigned char> const& data);
    bool fromSaeSystem(unsigned int ecuId, std::vector<unsigned char> const& data, std::size_t checksumLength);

    void clear() { m_numbers.clear(); }

    // Empty for a module that delivered none.
    std::string number(IEcu const& ecu) const;

private:
    std::vector<unsigned char> m_signature;
    std::size_t m_length;
    std::map<unsigned int, std::string> m_numbers; // by module id
};

} // namespace obd
