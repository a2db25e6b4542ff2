#pragma once

#include <memory>

namespace obd {

class IObdProxy;

// A unit of work for the Dispatcher.
class IDispatchable
{
public:
    virtual ~IDispatchable() = default;

    // The bus work, on the worker. The proxy may be null. Must not wait for other work: it would wait for itself.
    virtual void execute(std::shared_ptr<IObdProxy> const& proxy) = 0;

    // The closing step, on the application's thread, inside Dispatcher::dispatch. Not called for work that was
    // cancelled meanwhile.
    virtual void finish() = 0;
};

} // namespace obd
