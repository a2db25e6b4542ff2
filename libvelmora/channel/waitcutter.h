#pragma once

#include "libvelmora/channel/wire.h"

namespace velmora {

// Some adapters agree to a shorter wait for more replies and go on waiting as long as ever. A character ends what they
// are at (STOPPED), so the wait that they agreed to can be had all the same. Learns whether an adapter needs it, and
// whether it works there.
class WaitCutter
{
public:
    // A reply was left to end by itself: how long behind its last data the prompt came, and how long the adapter had
    // agreed to wait.
    void saw(WireTime waited, WireTime agreed);
    // A wait was cut: how long the prompt took then, and whether the reply was whole.
    void cut(WireTime took, bool whole);

    bool pays() const;

private:
    int m_late = 0; // replies in a row
    int m_failures = 0;
};

} // namespace velmora
