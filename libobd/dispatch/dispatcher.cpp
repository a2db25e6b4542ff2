#include "libobd/dispatch/dispatcherimpl.h"
#include "libobd/dispatch/dispatchqueue.h"
#include "libobd/dispatch/idispatchable.h"

#include <obd/dispatcher.h>

#include <utility>

namespace obd {

// Never destroyed: at the process's end a worker may still run, and log.
Dispatcher& Dispatcher::getInstance()
{
    static auto* const instance = new Dispatcher;
    return *instance;
}

Dispatcher::Dispatcher() : m_impl(std::make_shared<DispatcherImpl>(*this)), m_uiQueue(std::make_unique<DispatchQueue>())
{}

Dispatcher::~Dispatcher() = default;

std::shared_ptr<Dispatcher::DispatcherImpl> Dispatcher::impl() const
{
    std::lock_guard const lock(m_implMutex);
    return m_impl;
}

void Dispatcher::setProxy(std::shared_ptr<IObdProxy> const& proxy)
{
    std::lock_guard const lock(m_proxyMutex);
    m_proxy = proxy;
    impl()->setProxy(proxy);
}

bool Dispatcher::update(std::weak_ptr<IDispatchable> const& work)
{
    return impl()->update(work);
}

bool Dispatcher::scheduleUiTask(std::weak_ptr<IDispatchable> const& work)
{
    m_uiQueue->push(work);
    requestDispatch();
    return true;
}

std::shared_ptr<IDispatchable> Dispatcher::popUiTask()
{
    std::optional<std::weak_ptr<IDispatchable>> const entry = m_uiQueue->pop();
    return entry ? entry->lock() : nullptr;
}

void Dispatcher::requestDispatch()
{
    notify(&IDispatchRunner::onDispatchRequested);
}

void Dispatcher::dispatch()
{
    while (std::shared_ptr<IDispatchable> const task = popUiTask()) {
        task->finish();
    }
    std::shared_ptr<DispatcherImpl> const current = impl();
    current->queueKeepAliveIfDue();
    current->finishCompleted();
}

// The new worker gets its proxy last: until then its update refuses, so that it does not start beside the old one.
void Dispatcher::cancel()
{
    std::lock_guard const lock(m_proxyMutex);
    auto const fresh = std::make_shared<DispatcherImpl>(*this);
    std::shared_ptr<DispatcherImpl> old = fresh;
    {
        std::lock_guard const implLock(m_implMutex);
        m_impl.swap(old);
    }
    old->stop();
    fresh->setProxy(m_proxy);
}

} // namespace obd
