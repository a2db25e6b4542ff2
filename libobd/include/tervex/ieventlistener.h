#pragma once

namespace tervex {

/// Hears the events of one kind from an IEventProducer. Called on the thread that fires, while the producer's list is
/// locked: an implementation must not attach to or detach from the same producer inside onEvent, nor fire it again.
template <typename E>
class IEventListener
{
public:
    virtual ~IEventListener() = default;

    virtual void onEvent(E const& event) = 0;
};

} // namespace tervex
