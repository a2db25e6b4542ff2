#pragma once

#include <tervex/ieventlistener.h>

namespace tervex {

/// Announces changes of state to listeners. Inherited virtually by the interfaces that carry events, so that a class
/// takes the implementation from EventProducer. Listeners are not owned: who attaches keeps the listener alive until it
/// has detached it. A listener that is attached twice is called twice; one detach removes all its entries. Once detach
/// has returned no other thread is inside the listener.
template <typename E, typename L = IEventListener<E>>
class IEventProducer
{
public:
    virtual ~IEventProducer() = default;

    virtual void attach(L* listener) = 0; ///< at the end of the list; not owned
    virtual void detach(L* listener) = 0; ///< waits for a call on another thread
};

} // namespace tervex
