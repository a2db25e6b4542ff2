#include "libobd/dispatch/keepalivedispatchable.h"

#include <common/logrecord.h>

namespace obd {

KeepAliveDispatchable::KeepAliveDispatchable() : m_query(std::make_shared<MonitorStatus>()) {}

void KeepAliveDispatchable::execute(std::shared_ptr<IObdProxy> const& proxy)
{
    if (proxy == nullptr || m_cancelled) {
        return;
    }
    if (m_query->update(proxy) != IQuery::UpdateStatus::UpdateOk) {
        TERVEX_LOG(Error) << "Keep alive dispatch failed";
    }
}

} // namespace obd
