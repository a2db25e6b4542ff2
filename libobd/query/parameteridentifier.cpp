#include <obd/parameteridentifier.h>

#include <iomanip>
#include <locale>
#include <sstream>

namespace obd {

std::string ParameterIdentifier::toString() const
{
    std::ostringstream text;
    text.imbue(std::locale::classic());
    text << '$' << std::uppercase << std::hex << std::setw(2) << std::setfill('0') << static_cast<unsigned int>(m_id);
    return text.str();
}

} // namespace obd
