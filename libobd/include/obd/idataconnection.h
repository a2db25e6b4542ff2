#pragma once

#include <vector>

namespace obd {

/// A tap on the byte channel. Called on the sending or receiving thread with a lock of the channel held: return quickly
/// and don't call back into the channel.
class IConnectionLogger
{
public:
    virtual ~IConnectionLogger() = default;

    /// What was sent, its terminator included.
    virtual void onDataSent(std::vector<unsigned char> const& data) = 0;
    /// One message received, its delimiter removed.
    virtual void onDataReceived(std::vector<unsigned char> const& data) = 0;
};

/// The library's view of the byte channel to the adapter. DataBridge implements it; an application may bring its own.
/// Towards the adapter it is a byte stream, from the adapter a queue of messages, each ended by the delimiter byte.
class IDataConnection
{
public:
    virtual ~IDataConnection() = default;

    /// The byte that ends a message from now on; messages already queued stay as they are.
    virtual void setDelimiter(char delimiter) = 0;

    /// False once the channel is dead for good.
    virtual bool isValid() const = 0;

    /// Takes the oldest message, without its delimiter, waiting at most timeoutMs for one (0 or less: no wait). False
    /// on timeout, with out untouched. An empty message is a message.
    virtual bool receive(std::vector<unsigned char>& out, int timeoutMs) = 0;

    /// Queues bytes for the adapter. Never fails: what a dead channel is given is lost.
    virtual void send(std::vector<unsigned char> const& bytes) = 0;

    /// Taps, called in the order of registration. Not owned: who adds a logger removes it before it dies. Once
    /// removeLogger has returned, no call is under way. One that was added twice is removed one entry at a time.
    virtual void addLogger(IConnectionLogger* logger) = 0;
    virtual void removeLogger(IConnectionLogger* logger) = 0; ///< not from a logger's own call
};

} // namespace obd
