#pragma once

#include "libobd/dispatch/idispatchable.h"

#include <atomic>
#include <functional>
#include <memory>

namespace support {

// Work that counts its steps and does in them what a test says.
class FakeWork : public obd::IDispatchable
{
public:
    std::function<void()> onExecute = [] {};
    std::function<void()> onFinish = [] {};
    std::atomic<int> executed{0};
    std::atomic<int> finished{0};
    std::weak_ptr<obd::IObdProxy> lastProxy; // to be read after the execute

    void execute(std::shared_ptr<obd::IObdProxy> const& proxy) override
    {
        lastProxy = proxy;
        onExecute();
        ++executed;
    }
    void finish() override
    {
        ++finished;
        onFinish();
    }
};

} // namespace support
