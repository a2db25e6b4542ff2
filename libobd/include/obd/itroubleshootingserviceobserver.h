#pragma once

#include <obd/messagedatamodel.h>

#include <memory>

namespace obd {

/// Hears of the traffic with the adapter while logging is on.
class ITroubleshootingServiceObserver
{
public:
    virtual ~ITroubleshootingServiceObserver() = default;

    /// Unlike all other observers, this one is called on the thread that sends or receives, mostly the dispatcher's
    /// worker, in the middle of an exchange. Post what is wanted to a thread of your own and return; don't call
    /// anything that blocks or that asks the vehicle.
    virtual void onLogEntryAdded(std::shared_ptr<MessageDataModel> const& /*entry*/) {}
};

} // namespace obd
