#pragma once

#include "libobd/dispatch/idispatchable.h"

#include <functional>
#include <mutex>

namespace obd {

// Sends a bit of code to the application's thread. Must be held by a shared_ptr; code whose Callback has gone is not
// run.
class Callback : public IDispatchable, public std::enable_shared_from_this<Callback>
{
public:
    // Has the function run by the next Dispatcher::dispatch. Any thread. A function that was posted before and has not
    // run is replaced, and the new one runs once for each post.
    void post(std::function<void()> function);

    void execute(std::shared_ptr<IObdProxy> const& /*proxy*/) override {}
    void finish() override;

private:
    std::mutex m_mutex;
    std::function<void()> m_function; // protected by m_mutex; called as a copy, so that it may post again
};

} // namespace obd
