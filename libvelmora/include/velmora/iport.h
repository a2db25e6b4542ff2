#pragma once

#include <functional>
#include <string_view>

namespace velmora {

/// An open byte channel to an adapter. Runs on a thread of its own from start to close. An application that brings its
/// own transport implements it; see CarOptions::openPort.
class IPort
{
public:
    /// Bytes from the adapter, in any pieces. Called on the port's thread.
    using Receiver = std::function<void(std::string_view bytes)>;
    /// The link is gone for good: unplugged, closed by the other side. Called once, on the port's thread.
    using LossHandler = std::function<void()>;

    virtual ~IPort() = default;

    /// Begins to read. Once only.
    virtual void start(Receiver onBytes, LossHandler onLost) = 0;

    /// Queues bytes. From any thread; what is given after a loss or close is dropped.
    virtual void write(std::string_view bytes) = 0;

    /// Stops and waits for the port's thread. No handler is called afterwards. From any thread but the port's own.
    virtual void close() = 0;
};

} // namespace velmora
