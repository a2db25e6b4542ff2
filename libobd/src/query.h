#pragma once

#include <obd/dispatcher.h>

#include "libobd/src/idispatchable.h"
#include "libobd/src/pacedupdate.h"

#include <atomic>
#include <functional>
#include <memory>
#include <utility>

namespace obd {

// Runs a parameter on the worker without a waiting caller; the outcome comes back as a call on the application's
// thread. One run at a time, to be started again for the next. All on the application's thread.
//
// The parameter is one object for all runs, and a run that was cancelled may still be on the worker: start a cancelled
// query again only when the worker is known to be out of it, or build a new one.
template <class T>
class Query
{
public:
    using Function = std::function<void(bool success, std::shared_ptr<T> const& parameter)>;

    explicit Query(std::shared_ptr<T> const& parameter) : m_parameter(parameter) {}
    ~Query() { cancel(); }

    Query(Query const&) = delete;
    Query& operator=(Query const&) = delete;

    // Empties the parameter, unless it keeps a history, and queues a run; callback hears its end, inside
    // Dispatcher::dispatch, and may start the next. False while a run is on, which is left as it is, and without a
    // connection; the callback is dropped then. A callback that holds this query keeps it alive until the run has ended
    // or is cancelled.
    bool start(Function callback)
    {
        if (m_running.exchange(true)) {
            return false;
        }
        m_callback.swap(callback);
        if (!m_parameter->keepsHistory()) {
            m_parameter->clear();
        }
        m_dispatchable = std::make_shared<DispatchableQuery>(*this, m_parameter);
        if (!Dispatcher::getInstance().update(m_dispatchable)) {
            cancel();
            return false;
        }
        return true;
    }

    // Ends the run: its callback will not be called. A request that is on its way is not held up.
    void cancel()
    {
        // Goes last: it may hold the last reference to this query.
        Function const dropped = std::exchange(m_callback, nullptr);
        if (m_dispatchable != nullptr) {
            m_dispatchable->cancel();
            m_dispatchable = nullptr;
        }
        m_running = false;
    }

private:
    class DispatchableQuery;

    // Gives the callback away: the call may start the next run, or end this object.
    void finish(bool success)
    {
        Function const callback = std::exchange(m_callback, nullptr);
        std::shared_ptr<T> const parameter = m_parameter;
        m_running = false;
        if (callback) {
            callback(success, parameter);
        }
    }

    std::shared_ptr<DispatchableQuery> m_dispatchable; // of the run that is on
    std::atomic<bool> m_running{false};
    Function m_callback;
    std::shared_ptr<T> m_parameter;
};

// One run.
template <class T>
class Query<T>::DispatchableQuery : public IDispatchable
{
public:
    DispatchableQuery(Query<T>& owner, std::shared_ptr<T> parameter)
        : m_owner(&owner), m_parameter(std::move(parameter))
    {}

    // The owner may go after this.
    void cancel()
    {
        m_cancelled = true;
        m_owner = nullptr;
    }

    void execute(std::shared_ptr<IObdProxy> const& proxy) override
    {
        if (proxy != nullptr && !m_cancelled) {
            m_success = pacedUpdate(*m_parameter, proxy);
        }
    }

    void finish() override
    {
        if (m_owner != nullptr && !m_cancelled) {
            m_owner->finish(m_success);
        }
    }

private:
    Query<T>* m_owner; // null once cancelled; the application's thread alone
    std::shared_ptr<T> m_parameter;
    std::atomic<bool> m_success{false};
    std::atomic<bool> m_cancelled{false};
};

} // namespace obd
