#pragma once

#include <deque>
#include <string>
#include <utility>

namespace obdsim {

/// What a client has not taken yet, piece by piece. One that never reads loses what does not fit, as on a wire.
class UnsentText
{
public:
    static constexpr std::size_t mostBytes = 64 * 1024;

    void push(std::string text)
    {
        if (m_size + text.size() <= mostBytes) {
            m_size += text.size();
            m_pieces.push_back(std::move(text));
        }
    }
    void pop()
    {
        m_size -= m_pieces.front().size();
        m_pieces.pop_front();
    }
    void clear()
    {
        m_pieces.clear();
        m_size = 0;
    }
    bool empty() const { return m_pieces.empty(); }
    std::string const& front() const { return m_pieces.front(); }
    std::size_t size() const { return m_size; } ///< in bytes

private:
    std::deque<std::string> m_pieces;
    std::size_t m_size = 0;
};

} // namespace obdsim
