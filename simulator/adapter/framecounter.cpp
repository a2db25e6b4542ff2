#include "simulator/adapter/framecounter.h"

namespace obdsim {

namespace {

constexpr int firstFrameBytes = 6;
constexpr int nextFrameBytes = 7;

} // namespace

FrameCounter::FrameCounter(Protocol const& protocol, std::optional<int> expected, Quirks const& quirks)
    : m_can(isCan(protocol)), m_messages(quirks.has(Quirk::CountMessages)),
      m_expected(quirks.has(Quirk::CountIgnored) ? 0 : expected.value_or(0))
{}

void FrameCounter::add(Frame const& frame)
{
    bool const whole = endsMessage(frame);
    m_count += whole || !m_messages ? 1 : 0;
}

bool FrameCounter::isEnough() const
{
    return m_expected != 0 && m_count >= m_expected;
}

bool FrameCounter::endsMessage(Frame const& frame)
{
    if (!m_can || frame.data.size() < 2) {
        return true;
    }
    int& missing = m_missing[frame.source];
    switch (frame.data[0] >> 4) {
    case 0x1:
        missing =
            (((frame.data[0] & 0x0F) << 8 | frame.data[1]) - firstFrameBytes + nextFrameBytes - 1) / nextFrameBytes;
        return false;
    case 0x2:
        return --missing == 0;
    default:
        return true;
    }
}

} // namespace obdsim
