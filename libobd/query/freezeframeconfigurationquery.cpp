#include "libobd/query/freezeframeconfigurationquery.h"

#include <obd/iobdproxy.h>

namespace obd {

IQuery::UpdateStatus FreezeFrameConfigurationQuery::update(std::shared_ptr<IObdProxy> const& proxy)
{
    std::shared_ptr<IEcu> const ecu = proxy->ecu(m_ecuId);
    bool const detected = ecu != nullptr && ecu->detectFreezeFrameConfiguration(m_frame);
    return detected ? UpdateStatus::UpdateOk : UpdateStatus::UpdateFailed;
}

} // namespace obd
