#include "libvelmora/output/clockkeeper.h"

#include "libvelmora/output/recordtime.h"
#include "libvelmora/output/valuetext.h"

#include <cstdlib>

namespace velmora {

void ClockKeeper::takeLook()
{
    m_look = m_clocks();
    m_judge.look(m_look);
}

// By what the rows themselves tell: that holds also when an earlier attempt went wrong half way.
void ClockKeeper::follow(IHeldRows& rows) const
{
    std::optional<ClockStamp> const stamp = rows.heldStamp();
    ClockStamp const now = stampOf(m_look);
    if (stamp && stamp->bootId != now.bootId) {
        rows.release(Trust::Never); // the clock that dated them is gone
    } else if (stamp) {
        if (std::int64_t const step = stepBetween(stamp->offset, now.offset); step != 0) {
            rows.shiftHeld(step, now);
        }
        if (trust() != Trust::Wait) {
            rows.release(trust());
        }
    } else if (trust() == Trust::Wait) {
        rows.keepStamp(now);
    }
}

void ClockKeeper::resume(IHeldRows& rows)
{
    m_judge = ClockJudge();
    takeLook();
    follow(rows);
    done();
}

void ClockKeeper::begin(IHeldRows& rows)
{
    takeLook();
    m_step = m_held ? stepBetween(m_offset, stampOf(m_look).offset) : 0;
    follow(rows);
}

// Stamped before the clock was set: then it lies nearer to where the clock would be without.
SharedRecord ClockKeeper::dated(SharedRecord const& record) const
{
    std::int64_t const time = toMillis(timeOf(*record));
    bool const before = std::llabs(time - (m_look.wall - m_step)) < std::llabs(time - m_look.wall);
    return before ? std::make_shared<Record const>(shifted(*record, std::chrono::milliseconds(m_step))) : record;
}

void ClockKeeper::done()
{
    m_offset = stampOf(m_look).offset;
    m_held = trust() == Trust::Wait;
}

} // namespace velmora
