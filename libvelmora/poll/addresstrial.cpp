#include "libvelmora/poll/addresstrial.h"

#include <utility>

namespace velmora {

void AddressTrial::answered(std::chrono::milliseconds took)
{
    m_missed = 0;
    if (m_decided) {
        return;
    }
    ++m_asked;
    m_sum += m_asked > warmUps ? took : std::chrono::milliseconds(0);
    if (m_asked == warmUps + measured) {
        next();
    }
}

void AddressTrial::next()
{
    std::chrono::milliseconds const sum = std::exchange(m_sum, std::chrono::milliseconds(0));
    m_asked = 0;
    if (!m_addressed) {
        m_broadcast = sum;
        m_addressed = true;
        return;
    }
    // A tenth is what it should gain, for it is more traffic to the adapter.
    m_decided = true;
    m_addressed = sum * 10 < m_broadcast * 9;
}

void AddressTrial::missed()
{
    if (m_addressed && ++m_missed >= patience) {
        m_decided = true;
        m_addressed = false;
    }
}

} // namespace velmora
