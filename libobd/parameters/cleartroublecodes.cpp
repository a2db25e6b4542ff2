#include "libobd/parameters/cleartroublecodes.h"

#include "libobd/parameters/replychecks.h"

namespace obd {

void ClearTroubleCodes::clear()
{
    m_cleared.clear();
}

bool ClearTroubleCodes::isCleared(IEcu const& ecu) const
{
    bool const* const cleared = findOrLog(m_cleared, ecu);
    return cleared != nullptr && *cleared;
}

bool ClearTroubleCodes::fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data)
{
    bool const cleared = !data.empty();
    m_cleared[ecu->id()] = cleared;
    return cleared;
}

} // namespace obd
