#pragma once

#include <velmora/caroptions.h>

#include <functional>
#include <memory>

namespace obd {
class IDataConnection;
}

namespace velmora {

class IWire;

// What a session is to use: all that a car is told, and what only a session can be. Of the former, stop, onUnwritten,
// onTraffic and recorder are for whoever has the session to heed.
struct SessionOptions : CarOptions
{
    SessionOptions() = default;
    // Throws Error for a protocol that is none.
    explicit SessionOptions(CarOptions options);

    // Makes what stands between the library and the open port in place of the fast and healing channel, to be compared
    // with it; null for that channel.
    std::function<std::shared_ptr<obd::IDataConnection>(std::shared_ptr<IWire> const& wire)> makeChannel;
};

} // namespace velmora
