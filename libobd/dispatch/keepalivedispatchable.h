#pragma once

#include "libobd/dispatch/idispatchable.h"
#include "libobd/powertrain/monitorstatus.h"

#include <atomic>
#include <memory>

namespace obd {

// One request that keeps the adapter's link to the vehicle from timing out while the application sits idle: the
// monitor status, which every module must answer.
class KeepAliveDispatchable : public IDispatchable
{
public:
    KeepAliveDispatchable();

    // From now on execute does nothing. Any thread.
    void cancel() { m_cancelled = true; }

    void execute(std::shared_ptr<IObdProxy> const& proxy) override;
    void finish() override {}

private:
    std::atomic<bool> m_cancelled{false};
    std::shared_ptr<MonitorStatus> m_query;
};

} // namespace obd
