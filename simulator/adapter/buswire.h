#pragma once

#include "simulator/adapter/replytimer.h"
#include "simulator/car/vehicle.h"

#include <map>
#include <memory>

namespace obdsim {

/// Text of a reply and when it is said, counted from the request. Lines end in CR.
struct TimedText
{
    Time delay{};
    std::string text;
};

/// The text of one reply, without the final CR and prompt, and its duration.
struct BusReply
{
    std::vector<TimedText> texts;
    Time end{};
};

/// A frame and when its last bit has passed.
struct TimedFrame
{
    Time time{};
    Frame frame;
};

/// A request from the host.
struct BusRequest
{
    Bytes data;
    std::optional<int> expected; ///< the expected-count digit
};

/// The wire between an adapter and a car whose bus is open: puts requests on it and listens to the frames that come.
class BusWire
{
public:
    /// `vehicle` may be null as long as nothing is exchanged. The profile must outlive this.
    BusWire(std::shared_ptr<Vehicle> vehicle, AdapterProfile const& profile);

    /// Sends the request behind what `reply` holds already, `now` being its beginning.
    BusReply exchange(BusRequest const& request, Settings const& settings, BusReply reply, Time now);

    /// The bus was closed: what was learnt of it is gone, and so are the frames under way.
    void forget();

private:
    Time free(Time at) const;
    Time send(BusRequest const& request, Settings const& settings, Time at);
    void listen(BusRequest const& request, Settings const& settings, BusReply& reply, Time now, Time sent);
    static bool awaitsRest(Frame const& frame, Settings const& settings, std::map<std::uint32_t, std::size_t>& missing);
    bool isSent(Frame const& frame, Settings const& settings);
    Time pendingWait(Settings const& settings) const;

    std::shared_ptr<Vehicle> m_vehicle;
    AdapterProfile const& m_profile;
    ReplyTimer m_timer;
    std::vector<TimedFrame> m_frames;       ///< under way, in the order of time; a late one answers the next request
    std::map<std::uint32_t, int> m_allowed; ///< consecutive frames that flow control has left, by module
    Time m_busyUntil{};                     ///< the last byte on the wire
};

} // namespace obdsim
