#include "libvelmora/poll/multilimit.h"

#include <algorithm>

namespace velmora {

namespace {

constexpr int patience = 3;

std::size_t stepAbove(std::size_t proved)
{
    return proved < 2 ? 2 : proved < 3 ? 3 : MultiLimit::most;
}

} // namespace

std::size_t MultiLimit::now() const
{
    return std::min(m_highest, stepAbove(m_proved));
}

void MultiLimit::proved(std::size_t count)
{
    m_missed = 0;
    m_proved = std::max(m_proved, count);
}

// What was proved once and fails now is not proved: back to single requests.
void MultiLimit::failed(std::size_t count)
{
    m_missed = 0;
    m_highest = count > m_proved ? m_proved : 1;
}

void MultiLimit::missed(std::size_t count)
{
    if (++m_missed >= patience) {
        failed(count);
    }
}

} // namespace velmora
