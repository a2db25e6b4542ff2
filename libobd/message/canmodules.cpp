#include "libobd/message/canmodules.h"

namespace obd {

CanResponse& CanModules::make(unsigned int id)
{
    return m_first.size() < mostModules ? m_first.emplace_back(id).message : m_more[id];
}

} // namespace obd
