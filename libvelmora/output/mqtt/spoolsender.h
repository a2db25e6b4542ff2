#pragma once

#include "libvelmora/output/mqtt/spool.h"

#include <chrono>
#include <functional>
#include <map>
#include <optional>
#include <string>

namespace velmora {

// Hands what waits in a spool to a broker in batches, a few of them under way at a time, and forgets what is kept: by
// the broker's word, or by the mark of a consumer behind it. Reads no clock.
class SpoolSender
{
public:
    using Time = std::chrono::steady_clock::time_point;
    // Hands over one message; tells by which number its delivery will be told, or nothing if it was not taken.
    using Publish = std::function<std::optional<int>(std::string const& payload)>;
    using Tell = std::function<void(std::string const& text)>;

    // The spool must outlive it.
    SpoolSender(Spool& spool, std::string vehicle, bool waitsForMark, Publish publish, Tell tell);

    // A connection stands that has nothing under way: all that is not known to be kept is sent again.
    void onUp(Time now);
    void onDown();
    void onDelivered(int message, Time now);
    // The broker did not take it, though it had come.
    void onRefused(int message);
    // The consumer has stored all up to that number.
    void onMark(std::int64_t seq, Time now);
    // Sends what there is. Call it often.
    void pump();

    // Whether nothing was heard of what was sent for so long that the connection is worth a new one. Once: then it has
    // more patience than before, until something moves.
    bool isStuck(Time now);

    bool isUp() const { return m_up; }
    bool isUnderway() const { return !m_flights.empty(); }

private:
    bool sendBatch();
    void keep(std::int64_t seq);
    void startAgain();
    void onProgress(Time now);

    Spool& m_spool;
    std::string const m_vehicle;
    bool const m_waitsForMark;
    Publish const m_publish;
    Tell const m_tell;
    bool m_up = false;
    std::int64_t m_sent = 0;               // the last number handed over
    std::int64_t m_stored = 0;             // up to here all is known to be kept
    std::map<int, std::int64_t> m_flights; // message, last number in it
    std::map<std::int64_t, bool> m_ended;  // last number of each batch under way, and whether it was delivered
    Time m_progress;
    std::chrono::seconds m_patience;
};

} // namespace velmora
