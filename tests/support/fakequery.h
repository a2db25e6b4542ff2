#pragma once

#include <obd/iquery.h>

#include <atomic>
#include <functional>
#include <memory>

namespace support {

// A query that comes out as a test says, without a proxy's help.
class FakeQuery : public obd::IQuery
{
public:
    using Status = obd::IQuery::UpdateStatus;

    std::function<Status()> onUpdate = [] { return Status::UpdateOk; };
    std::atomic<unsigned int> limit{1000};
    std::atomic<bool> history{false};
    std::atomic<int> updates{0};
    std::atomic<int> clears{0};

    Status update(std::shared_ptr<obd::IObdProxy> const& /*proxy*/) override
    {
        ++updates;
        return onUpdate();
    }
    unsigned int timeout() const override { return limit; }
    void clear() override { ++clears; }
    bool keepsHistory() const override { return history; }
};

} // namespace support
