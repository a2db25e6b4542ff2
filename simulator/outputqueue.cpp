#include "simulator/outputqueue.h"

#include <algorithm>
#include <utility>

namespace obdsim {

void OutputQueue::push(Time due, std::string text)
{
    if (!text.empty()) {
        m_pieces.push_back({std::max(due, end(due)), std::move(text)});
    }
}

std::optional<Time> OutputQueue::next() const
{
    if (m_pieces.empty()) {
        return std::nullopt;
    }
    return m_pieces.front().due;
}

std::string OutputQueue::take(Time time)
{
    std::string text;
    while (!m_pieces.empty() && m_pieces.front().due <= time) {
        text += m_pieces.front().text;
        m_pieces.pop_front();
    }
    return text;
}

Time OutputQueue::end(Time idle) const
{
    return m_pieces.empty() ? idle : m_pieces.back().due;
}

void OutputQueue::clear()
{
    m_pieces.clear();
}

} // namespace obdsim
