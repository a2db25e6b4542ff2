#include "libobd/dispatch/dispatcherimpl.h"

#include "libobd/dispatch/idispatchable.h"
#include "libobd/dispatch/keepalivedispatchable.h"

#include <common/clock.h>
#include <common/logrecord.h>

namespace obd {
namespace {

// Modules end a diagnostic session that hears nothing for about five seconds (P3 of ISO 14230-2).
constexpr unsigned int keepAliveMillis = 5000;

} // namespace

Dispatcher::DispatcherImpl::DispatcherImpl(Dispatcher& dispatcher)
    : m_dispatcher(dispatcher), m_task(this), m_keepAlive(std::make_shared<KeepAliveDispatchable>())
{}

// The worker uses the members behind m_task until it has ended.
Dispatcher::DispatcherImpl::~DispatcherImpl()
{
    DispatcherImpl::stop();
}

void Dispatcher::DispatcherImpl::stop()
{
    m_keepAlive->cancel();
    m_task.stop();
}

// The keep-alive goes by way of the main thread, so that it ends with an application that hangs.
void Dispatcher::DispatcherImpl::queueKeepAliveIfDue()
{
    if (m_keepAliveDue.exchange(false)) {
        update(m_keepAlive);
    }
}

// No more than what is there at the start: a query that repeats itself on a dead link fails at once and would keep the
// main thread in here. What comes later brings its own notification. An entry whose work has gone ends the call, too.
void Dispatcher::DispatcherImpl::finishCompleted()
{
    for (std::size_t left = m_task.completed().size(); left > 0; --left) {
        std::optional<std::weak_ptr<IDispatchable>> const entry = m_task.completed().pop();
        std::shared_ptr<IDispatchable> const work = entry ? entry->lock() : nullptr;
        if (work == nullptr) {
            return;
        }
        work->finish();
    }
}

void Dispatcher::DispatcherImpl::onTaskStarted()
{
    m_lastActivity = tervex::currentMillis();
}

void Dispatcher::DispatcherImpl::onTaskCompleted()
{
    m_lastActivity = tervex::currentMillis();
    requestDispatch();
}

void Dispatcher::DispatcherImpl::onIdle()
{
    unsigned int const now = tervex::currentMillis();
    if (now - m_lastActivity > keepAliveMillis) {
        m_keepAliveDue = true;
        m_lastActivity = now;
        requestDispatch();
    }
}

// A runner that throws must not end the worker.
void Dispatcher::DispatcherImpl::requestDispatch()
{
    try {
        m_dispatcher.requestDispatch();
    } catch (...) {
        TERVEX_LOG(Fatal) << "Dispatch runner threw an exception";
    }
}

} // namespace obd
