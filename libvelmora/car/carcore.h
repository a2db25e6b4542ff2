#pragma once

#include "libvelmora/car/livestate.h"
#include "libvelmora/car/onecar.h"
#include "libvelmora/car/threadanswer.h"
#include "libvelmora/car/traffictap.h"
#include "libvelmora/car/watchstate.h"
#include "libvelmora/session/session.h"

#include <obd/isensorservice.h>
#include <velmora/car.h>

#include <chrono>
#include <condition_variable>
#include <deque>
#include <functional>
#include <future>
#include <memory>
#include <mutex>
#include <stop_token>
#include <thread>
#include <type_traits>
#include <vector>

namespace velmora {

// The thread of a car: what callers ask, what pollers read, and the link, one at a time.
class CarCore
{
public:
    // Connects. Throws Error as Car does.
    explicit CarCore(CarOptions options);
    ~CarCore();
    CarCore(CarCore const&) = delete;
    CarCore& operator=(CarCore const&) = delete;

    // Runs a function of the session on the car's thread and gives what it gives or throws.
    template <typename Function>
    auto call(Function const& function) -> std::invoke_result_t<Function const&, Session&>
    {
        return onThread([&] { return function(openSession()); });
    }

    std::shared_ptr<WatchState> watch(std::vector<std::string> const& sensors, Car::OnReading onReading,
                                      Car::OnLink onLink);
    std::shared_ptr<LiveState> live(LiveWish const& wish);
    void reconnect();
    // Has the core ask for sensors over and over.
    void keepAsking(std::vector<std::string> const& sensors);

    // Throws Error if the link is lost, the adapter has fallen silent, or the car was stopped.
    void check();
    // As a session has them; without one there is nothing to tell.
    std::string trouble();
    std::string port();

private:
    friend class LiveReader;
    using Clock = std::chrono::steady_clock;

    // The answer is shared, for its thread may still hold it when the waiting one goes on.
    template <typename Function>
    auto onThread(Function const& function) -> std::invoke_result_t<Function const&>
    {
        refuseCallback();
        auto const answer = std::make_shared<ThreadAnswer<std::invoke_result_t<Function const&>>>();
        post([answer, function] { answer->run(function); });
        return answer->get();
    }

    void interrupt();
    void refuseIfStopped() const;
    void refuseCallback() const;
    void post(std::function<void()> work);
    Session& openSession() const;

    // The car's thread alone, from here on.
    void run(std::promise<void>& connected);
    void connect();
    void disconnect();
    void noteEnd() const;
    void wait();
    void runWork();
    void startWatch(std::shared_ptr<WatchState> const& state);
    void deliver(std::shared_ptr<WatchState> const& state, std::vector<Reading> const& readings);
    void dropEnded();
    void superviseLink();
    bool isLinkLost();
    void comeBack();

    OneCar const m_place;
    CarOptions const m_options;
    std::vector<std::shared_ptr<WatchState>> m_watches;
    std::vector<std::weak_ptr<LiveState>> m_lives;
    Clock::time_point m_lastReading;
    Clock::time_point m_nextTry;
    std::chrono::seconds m_pause{0}; // before the try after the next

    std::mutex m_mutex;
    std::condition_variable m_wake;
    std::deque<std::function<void()>> m_work; // protected by m_mutex
    bool m_stop = false;                      // protected by m_mutex
    std::unique_ptr<Session> m_session;       // changed under m_mutex, by the car's thread alone
    // Of the session, and gone before it.
    std::unique_ptr<TrafficTap> m_traffic;
    std::shared_ptr<obd::ISensorService> m_asking;
    std::thread m_thread;
    std::stop_callback<std::function<void()>> m_onStop;
};

} // namespace velmora
