#pragma once

#include "simulator/adapter/quirk.h"
#include "simulator/bus/frame.h"

#include <map>

namespace obdsim {

/// Counts replies for the expected-count digit. An ELM327 counts frames, which are lines with headers on; it ends
/// behind the last one even if that leaves a message half sent (data sheet v2.1, pages 32 and 56). Some clones count
/// messages.
class FrameCounter
{
public:
    /// `expected`: the digit. 0 means nothing that a data sheet tells; it is taken as none.
    FrameCounter(Protocol const& protocol, std::optional<int> expected, Quirks const& quirks);

    void add(Frame const& frame);

    /// As many replies as were expected have come.
    bool isEnough() const;

private:
    bool endsMessage(Frame const& frame);

    bool m_can;
    bool m_messages;
    int m_expected = 0;
    int m_count = 0;
    std::map<std::uint32_t, int> m_missing; ///< consecutive frames still to come, by module
};

} // namespace obdsim
