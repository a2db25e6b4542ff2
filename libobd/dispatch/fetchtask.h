#pragma once

#include "libobd/dispatch/idispatchable.h"
#include "libobd/dispatch/pacedupdate.h"

#include <atomic>
#include <future>
#include <memory>
#include <utility>

namespace obd {

// Runs a query for a caller that waits for the promise.
template <class T>
class FetchTask : public IDispatchable
{
public:
    FetchTask(std::shared_ptr<T> query, std::shared_ptr<std::promise<bool>> promise)
        : m_query(std::move(query)), m_promise(std::move(promise))
    {}

    // The caller has given up: don't ask the vehicle any more. Any thread.
    void cancel() { m_cancelled = true; }

    // Whatever the query throws passes on, once the caller has its answer.
    void execute(std::shared_ptr<IObdProxy> const& proxy) override
    {
        bool success = false;
        try {
            success = proxy != nullptr && !m_cancelled && pacedUpdate(*m_query, proxy);
        } catch (...) {
            m_promise->set_value(false);
            throw;
        }
        m_promise->set_value(success);
    }

    void finish() override {}

private:
    std::shared_ptr<T> m_query;
    std::shared_ptr<std::promise<bool>> m_promise;
    std::atomic<bool> m_cancelled{false};
};

} // namespace obd
