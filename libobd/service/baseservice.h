#pragma once

#include <obd/iconnectionnotifier.h>
#include <obd/iecumanager.h>
#include <obd/ivelmorasettings.h>
#include <obd/unitsystem.h>
#include <tervex/ieventlistener.h>

#include <atomic>
#include <memory>
#include <mutex>

namespace obd {

class Callback;
class IObdVelmora;

// The common base of all services: follows connection, current control module and unit system. A service that is made
// by itself follows from within its constructor to within its destructor: make and drop it while no other thread opens,
// closes, selects a module or changes settings. The builders make a BuiltService, which has no such rule.
class BaseService : public tervex::IEventListener<EcuManagerEvent>,
                    public IConnectionNotifierListener,
                    public tervex::IEventListener<VelmoraSettingsEvent>
{
public:
    static constexpr unsigned int servicePriority = 1;

    enum class Following
    {
        AtOnce,
        Later, // with startFollowing, once the whole object stands
    };

    // obd must outlive the service. On a live connection the service starts complete, without an event.
    explicit BaseService(IObdVelmora const* obd, unsigned int priority = servicePriority,
                         Following following = Following::AtOnce);
    ~BaseService() override;
    BaseService(BaseService const&) = delete;
    BaseService& operator=(BaseService const&) = delete;

    void onEvent(EcuManagerEvent const& event) override;
    virtual bool isConnected() const { return m_connected; }
    void onConnectionOpened() override;
    void onConnectionClosed() override;
    void onEvent(VelmoraSettingsEvent const& event) override;

protected:
    // Attach to all that is followed, and learn its state; and the reverse, which waits for events that are being told
    // on other threads and may come more than once. A service that follows more overrides both.
    virtual void startFollowing();
    virtual void stopFollowing();

    // Hooks; empty here. The first two run on the application's thread, inside Dispatcher::dispatch.
    virtual void onServiceConnected() {}
    virtual void onServiceDisconnected() {}
    // On the thread that fires: the one that selects a module, or closes the connection.
    virtual void onEcuChanged() {}
    // On the thread that changes the setting.
    virtual void onUnitSystemChanged() {}

    IObdVelmora const* obd() const { return m_obd; }
    std::shared_ptr<IEcu> ecu() const;
    // The current control module while there is a connection, else null. An operation takes it once, at its start, for
    // it may change meanwhile.
    std::shared_ptr<IEcu> connectedEcu() const { return isConnected() ? ecu() : nullptr; }
    UnitSystem unitSystem() const { return m_unitSystem; }

private:
    void follow();
    void unfollow();
    void readState();
    void readEcu();

    IObdVelmora const* const m_obd;
    unsigned int const m_priority;
    mutable std::mutex m_ecuMutex; // a leaf
    std::shared_ptr<IEcu> m_ecu;   // protected by m_ecuMutex
    std::atomic<UnitSystem> m_unitSystem{UnitSystem::Metric};
    std::atomic<bool> m_connected{false};
    std::atomic<unsigned int> m_unitEvents{0};
    std::atomic<unsigned int> m_connectionEvents{0};
    std::shared_ptr<Callback> m_openedCallback;
    std::shared_ptr<Callback> m_closedCallback;
    std::shared_ptr<Callback> m_spareCallback; // held and never posted
};

} // namespace obd
