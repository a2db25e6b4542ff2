#pragma once

#include "simulator/peer.h"

#include <deque>

namespace obdsim {

/// Text on its way to the host, each piece with the time at which it arrives.
/// Pieces leave in the order in which they were put in.
class OutputQueue
{
public:
    /// A time before that of the last piece in the queue counts as that time.
    void push(Time due, std::string text);

    std::optional<Time> next() const;

    /// All text due up to `time`, removed from the queue.
    std::string take(Time time);

    /// When the last piece leaves; `idle` if the queue is empty.
    Time end(Time idle) const;

    void clear();

private:
    struct Piece
    {
        Time due;
        std::string text;
    };

    std::deque<Piece> m_pieces;
};

} // namespace obdsim
