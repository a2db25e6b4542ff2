#pragma once

namespace tervex {

/// Hears the events of one kind from an IEventProducer. Called on the thread that fires. Inside onEvent listeners may
/// be attached and detached, the one that is called too; one that was attached there hears the next event first.
template <typename E>
class IEventListener
{
public:
    virtual ~IEventListener() = default;

    virtual void onEvent(E const& event) = 0; ///< on the thread that fires
};

} // namespace tervex
