#pragma once

#include "libobd/dispatch/fetchtask.h"

#include <common/logrecord.h>
#include <obd/dispatcher.h>

#include <chrono>
#include <future>
#include <memory>

namespace obd {

// How long a fetch waits: the query's own time-out and a margin for the queue. A time-out beyond what a signed integer
// holds is a negative one and counts as none.
std::chrono::milliseconds fetchLimit(unsigned int timeoutMs);

// Runs a query on the worker and waits for it: true if it succeeded, and its values can be read. False, with a log
// line, if there is no connection, if the query failed, or if its time-out and 50 ms more have passed, in which the
// time in the queue counts. After a false the query may still be in the worker's hands: drop it, don't use it again.
// Any thread but the worker.
template <class T>
bool fetch(std::shared_ptr<T> const& query)
{
    auto const promise = std::make_shared<std::promise<bool>>();
    std::future<bool> answer = promise->get_future();
    auto const task =
        std::make_shared<FetchTask<T>>(query, promise); // held here until the end: the queue keeps nothing
    std::chrono::milliseconds const limit = fetchLimit(query->timeout());
    if (!Dispatcher::getInstance().update(task)) {
        return false;
    }
    if (answer.wait_for(limit) != std::future_status::ready) {
        TERVEX_LOG(Error) << "Future not ready";
        task->cancel();
        return false;
    }
    if (!answer.get()) {
        TERVEX_LOG(Error) << "Fetch done with failure";
        return false;
    }
    return true;
}

} // namespace obd
