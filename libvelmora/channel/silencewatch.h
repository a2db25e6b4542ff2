#pragma once

#include "libvelmora/channel/wire.h"

namespace velmora {

// Tells an adapter that is gone from one that pauses: not a byte has come for seconds, whatever was sent.
class SilenceWatch
{
public:
    void wrote(WireTime now)
    {
        m_from = m_unheard == 0 ? now : m_from;
        ++m_unheard;
    }
    void heard() { m_unheard = 0; }

    // When the silence will have been long enough; slow clones pause for a second or two.
    WireTime end() const { return m_unheard == 0 ? WireTime::max() : m_from + longestPause; }
    // Whether a command and both questions of who it is went unheard, however short that was.
    bool isUnheard() const { return m_unheard >= fewestLines; }
    // For who has just asked in vain whether it is there.
    bool isGone(WireTime now) const { return m_unheard >= fewestLines && now >= end(); }

private:
    static constexpr WireTime longestPause{8000};
    static constexpr int fewestLines = 3; // a command, and the two questions of who it is

    int m_unheard = 0; // lines since the last byte
    WireTime m_from{0};
};

} // namespace velmora
