#include "libvelmora/car/carcore.h"

#include "libvelmora/car/carsensors.h"

#include <obd/ivelmorasettings.h>
#include <obd/parameterfactory.h>

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds step{100};

} // namespace

CarCore::CarCore(CarOptions options) : m_options(std::move(options)), m_onStop(m_options.stop, [this] { interrupt(); })
{
    auto const connected = std::make_shared<std::promise<void>>();
    try {
        m_thread = std::thread([this, connected] { run(*connected); });
        connected->get_future().get();
    } catch (...) {
        if (m_thread.joinable()) {
            m_thread.join();
        }
        throw;
    }
}

CarCore::~CarCore()
{
    {
        std::lock_guard const lock(m_mutex);
        m_stop = true;
    }
    interrupt();
    m_thread.join();
}

void CarCore::interrupt()
{
    std::lock_guard const lock(m_mutex);
    m_wake.notify_one();
    if (m_session != nullptr) {
        m_session->interrupt();
    }
}

void CarCore::refuseIfStopped() const
{
    if (m_options.stop.stop_requested()) {
        throw Error(ErrorKind::Interrupted, "Interrupted");
    }
}

void CarCore::refuseCallback() const
{
    if (std::this_thread::get_id() == m_thread.get_id()) {
        throw Error(ErrorKind::WrongUse, "A callback asked the car for something that it would have to wait for",
                    {"callbacks run on the car's own thread: ask from another one"});
    }
}

void CarCore::post(std::function<void()> work)
{
    std::lock_guard const lock(m_mutex);
    m_work.push_back(std::move(work));
    m_wake.notify_one();
    if (m_session != nullptr) {
        m_session->loop().wake();
    }
}

Session& CarCore::openSession() const
{
    if (m_session == nullptr) {
        refuseIfStopped();
        throw Error(ErrorKind::LinkLost, "The link to the adapter is lost",
                    {"a watch tries to come back by itself; reconnect() tries at once"});
    }
    m_session->checkAdapter(); // one that fell silent may be back
    return *m_session;
}

void CarCore::run(std::promise<void>& connected)
{
    try {
        connect();
    } catch (...) {
        disconnect();
        connected.set_exception(std::current_exception());
        return;
    }
    connected.set_value();
    while (true) {
        wait();
        {
            std::lock_guard const lock(m_mutex);
            if (m_stop) {
                break;
            }
        }
        runWork();
        dropEnded();
        superviseLink();
    }
    disconnect();
}

void CarCore::wait()
{
    auto const limit = Clock::now() + step;
    if (m_session != nullptr) {
        m_session->loop().runUntil(
            [this] {
                std::lock_guard const lock(m_mutex);
                return m_stop || !m_work.empty();
            },
            limit);
        return;
    }
    std::unique_lock lock(m_mutex);
    m_wake.wait_until(lock, limit, [this] { return m_stop || !m_work.empty(); });
}

void CarCore::runWork()
{
    std::deque<std::function<void()>> work;
    {
        std::lock_guard const lock(m_mutex);
        work.swap(m_work);
    }
    for (std::function<void()> const& each : work) {
        each();
    }
}

std::shared_ptr<WatchState> CarCore::watch(std::vector<std::string> const& sensors, Car::OnReading onReading,
                                           Car::OnLink onLink)
{
    auto state = std::make_shared<WatchState>(sensors, std::move(onReading), std::move(onLink));
    call([&](Session& /*session*/) {
        startWatch(state);
        m_watches.push_back(state);
    });
    return state;
}

std::shared_ptr<LiveState> CarCore::live(LiveWish const& wish)
{
    return call([&](Session& session) {
        auto state = std::make_shared<LiveState>(session, wish);
        std::erase_if(m_lives, [](std::weak_ptr<LiveState> const& each) { return each.expired(); });
        m_lives.push_back(state);
        return state;
    });
}

void CarCore::startWatch(std::shared_ptr<WatchState> const& state)
{
    auto sink = [this, state](PollResult const& result) {
        post([this, state, readings = result.readings] { deliver(state, readings); });
    };
    state->setPoller(std::make_unique<Poller>(m_session->proxy(), pollSources(*m_session, state->sensors()),
                                              carefulPace(m_session->proxy()->protocol()), m_session->units(), sink));
}

void CarCore::deliver(std::shared_ptr<WatchState> const& state, std::vector<Reading> const& readings)
{
    m_lastReading = Clock::now();
    for (Reading const& reading : readings) {
        state->tell(reading);
    }
}

void CarCore::dropEnded()
{
    std::erase_if(m_watches, [](std::shared_ptr<WatchState> const& watch) {
        if (watch->ended()) {
            watch->setPoller(nullptr);
        }
        return watch->ended();
    });
}

} // namespace velmora
