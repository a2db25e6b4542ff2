#include "libobd/dispatch/dispatchertask.h"

#include "libobd/dispatch/idispatchable.h"

#include <common/clock.h>
#include <common/logrecord.h>
#include <common/tracestream.h>
#include <obd/iobdproxy.h>

namespace obd {
namespace {

constexpr unsigned int pollMillis = 10;

} // namespace

DispatcherTask::DispatcherTask(DispatcherTaskObserver* observer) : m_observer(observer) {}

DispatcherTask::~DispatcherTask()
{
    stop();
}

void DispatcherTask::setProxy(std::shared_ptr<IObdProxy> const& proxy)
{
    std::lock_guard const lock(m_proxyMutex);
    m_proxy = proxy;
}

std::shared_ptr<IObdProxy> DispatcherTask::proxy() const
{
    std::lock_guard const lock(m_proxyMutex);
    return m_proxy;
}

bool DispatcherTask::update(std::weak_ptr<IDispatchable> const& work)
{
    std::lock_guard const lock(m_startMutex);
    if (!m_started && !start()) {
        return false;
    }
    m_pending.push(work);
    return true;
}

bool DispatcherTask::start()
{
    std::shared_ptr<IObdProxy> const current = proxy();
    if (m_stop || current == nullptr || !current->isConnected()) {
        TERVEX_LOG(Error) << "Proxy not connected";
        return false;
    }
    m_started = m_thread.start([](DispatcherTask* task) { task->updateTask(); }, this);
    if (!m_started) {
        TERVEX_LOG(Fatal) << "DispatcherTask failed to start";
        return false;
    }
    tervex::TraceStream << "DispatcherTask started";
    return true;
}

void DispatcherTask::updateTask()
{
    tervex::TraceStream << "DispatcherTask::updateTask started";
    m_observer->onTaskStarted();
    while (!m_stop) {
        if (std::optional<std::weak_ptr<IDispatchable>> const entry = m_pending.pop()) {
            run(*entry);
        } else {
            tervex::sleepMillis(pollMillis);
            m_observer->onIdle();
        }
    }
    tervex::TraceStream << "DispatcherTask::updateTask about to exit";
}

void DispatcherTask::run(std::weak_ptr<IDispatchable> const& entry)
{
    if (std::shared_ptr<IDispatchable> const work = entry.lock()) {
        execute(*work);
        m_completed.push(entry);
        m_observer->onTaskCompleted();
    }
}

// Work that throws is finished like any other, so that a repeating query asks again.
void DispatcherTask::execute(IDispatchable& work)
{
    try {
        work.execute(proxy());
    } catch (...) {
        TERVEX_LOG(Fatal) << "Dispatchable threw an exception";
    }
}

void DispatcherTask::stop()
{
    {
        // Not held while joining: the work that the worker is at may be about to queue more.
        std::lock_guard const lock(m_startMutex);
        m_stop = true;
        m_started = false;
    }
    m_thread.join();
    m_pending.clear();
    m_completed.clear();
    setProxy(nullptr);
}

} // namespace obd
