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

} // namespace obd
