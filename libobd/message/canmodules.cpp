#include "libobd/message/canmodules.h"

namespace obd {

CanResponse& CanModules::operator[](unsigned int id)
{
    for (Module& module : m_first) {
        if (module.id == id) {
            return module.message;
        }
    }
    return m_first.size() < mostModules ? m_first.emplace_back(id).message : m_more[id];
}

} // namespace obd
