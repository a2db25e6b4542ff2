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

    // An earlier visit has learnt that it is needed and works.
    void recall();

    bool pays() const;
    // How much later than agreed the first cut comes, so that an adapter that has changed shows that it ends by itself.
    WireTime doubt() const;

private:
    int m_late = 0; // replies in a row
    int m_failures = 0;
    bool m_recalled = false; // and not seen so far
};

} // namespace velmora
