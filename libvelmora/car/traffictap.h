#pragma once

#include <obd/itroubleshootingservice.h>
#include <tervex/observer.h>

#include <functional>
#include <memory>
#include <utility>

namespace velmora {

// Hands on the core's log of the traffic for as long as it lives. The library must be open.
class TrafficTap : public tervex::Observer<obd::ITroubleshootingServiceObserver>
{
public:
    using Listener = std::function<void(obd::MessageDataModel const&)>;

    explicit TrafficTap(Listener listener)
        : m_listener(std::move(listener)), m_service(obd::TroubleshootingServiceBuilder::createTroubleshootingService())
    {
        m_service->attach(this);
        m_service->startLogging();
    }
    ~TrafficTap() override = default;
    TrafficTap(TrafficTap const&) = delete;
    TrafficTap& operator=(TrafficTap const&) = delete;

private:
    void onLogEntryAdded(std::shared_ptr<obd::MessageDataModel> const& entry) override { m_listener(*entry); }

    Listener const m_listener;
    // Its end waits for an entry that is under way on another thread, which detaching would not.
    std::shared_ptr<obd::ITroubleshootingService> m_service;
};

} // namespace velmora
