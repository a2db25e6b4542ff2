#pragma once

#include "libvelmora/channel/wire.h"

#include <map>
#include <optional>
#include <string>

namespace velmora {

// Frames of each module in a reply.
using FrameSet = std::map<unsigned int, unsigned int>;

// Learns how many frames a request brings, so that the adapter can be told how many to wait for. Key is the exact text
// of a request with the address that it goes to. Keeps no time of its own.
class CountLearner
{
public:
    // The count to send with a request, 1 to 9; nothing to send it plainly.
    std::optional<unsigned int> countFor(std::string const& request, WireTime now) const;

    // A plain reply in which every module's message was whole, and the time that it took.
    void learn(std::string const& request, FrameSet const& frames, WireTime took, WireTime now);
    // A plain reply that brought less than that.
    void forget(std::string const& request) { m_entries.erase(request); }
    // Whether a counted reply holds what the plain ones held. A good one tells by its time whether counting pays.
    bool accept(std::string const& request, FrameSet const& frames, WireTime took);
    // A counted reply failed: the request is to be learnt anew. Three of them end the counting.
    void fail(std::string const& request);

    // Something changed that replies depend on.
    void clear() { m_entries.clear(); }
    void switchOff() { m_off = true; }
    bool isOff() const { return m_off; }
    // Whether a counted reply was ever taken.
    bool works() const { return m_accepted > 0; }

    // What was learnt, to be kept; and what was kept, to be taken on trust until a reply is otherwise.
    std::map<std::string, FrameSet> learnt() const;
    void recall(std::string const& request, FrameSet const& frames);

private:
    struct Entry
    {
        FrameSet frames;
        int equal = 0;       // plain replies in a row with these frames
        WireTime plain{0};   // the quickest plain reply
        WireTime counted{0}; // the quickest counted reply
        int accepted = 0;
        bool useless = false; // the adapter gains nothing by it
    };

    std::map<std::string, Entry> m_entries;
    WireTime m_lastCheck{0}; // when a request that is known was last asked plainly
    int m_failures = 0;
    int m_accepted = 0;
    bool m_off = false;
};

} // namespace velmora
