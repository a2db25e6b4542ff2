#pragma once

#include "tests/support/dispatchloop.h"
#include "tests/support/fakeproxy.h"
#include "tests/support/workerclock.h"

#include <obd/dispatcher.h>

#include <memory>

namespace support {

// A Dispatcher over a fake proxy, with an application's loop and a clock that stands still. Leaves the process's
// Dispatcher without worker, work and proxy when it goes.
class DispatcherRig
{
public:
    explicit DispatcherRig(unsigned int startMs = 1000) : clock(startMs) { dispatcher.setProxy(proxy); }
    ~DispatcherRig()
    {
        dispatcher.cancel();
        loop.runPending();
        dispatcher.setProxy(nullptr);
    }
    DispatcherRig(DispatcherRig const&) = delete;
    DispatcherRig& operator=(DispatcherRig const&) = delete;

    WorkerClock clock;
    std::shared_ptr<FakeProxy> const proxy = std::make_shared<FakeProxy>();
    obd::Dispatcher& dispatcher = obd::Dispatcher::getInstance();
    DispatchLoop loop;
};

} // namespace support
