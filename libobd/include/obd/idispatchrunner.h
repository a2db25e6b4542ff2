#pragma once

namespace obd {

/// What an application attaches to the Dispatcher, to be told that there is work for its main thread.
class IDispatchRunner
{
public:
    virtual ~IDispatchRunner() = default;

    /// Arrange one call of Dispatcher::dispatch() on the main thread, soon: one for each call of this, not one for
    /// several. Called on any thread, the library's worker too. Return quickly, and don't call back into the library:
    /// calling dispatch() from here deadlocks or runs observers on the wrong thread.
    virtual void onDispatchRequested() = 0;
};

} // namespace obd
