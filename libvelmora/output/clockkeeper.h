#pragma once

#include "libvelmora/output/clockjudge.h"
#include "libvelmora/output/record.h"

#include <optional>

namespace velmora {

// What an output has taken in while the clock may still be set. Calls throw Error and leave all as it was then.
class IHeldRows
{
public:
    // By which clock they are dated; nothing while none is held.
    virtual std::optional<ClockStamp> heldStamp() = 0;
    virtual void keepStamp(ClockStamp const& stamp) = 0;
    // Moves the times in all of them, which are dated like that from now on.
    virtual void shiftHeld(std::int64_t millis, ClockStamp const& stamp) = 0;
    // None is held any more: their times are right, or nobody will ever know how wrong they are.
    virtual void release(ClockJudge::Trust trust) = 0;

protected:
    ~IHeldRows() = default;
};

// Follows the machine's clocks for an output that dates its records: what was stamped by a clock that was wrong at boot
// is repaired once that is set. What was left by an exception begins again with begin, and the same records.
class ClockKeeper
{
public:
    using Trust = ClockJudge::Trust;

    explicit ClockKeeper(ClockSource clocks) : m_clocks(std::move(clocks)) {}

    // After rows were opened that may be held since an earlier run.
    void resume(IHeldRows& rows);
    // Before records are added: repairs what is held, and tells whether it still is, and what is added now.
    void begin(IHeldRows& rows);
    // A record as it has to be added.
    SharedRecord dated(SharedRecord const& record) const;
    // All were added.
    void done();

    Trust trust() const { return m_judge.trust(); }
    ClockLook const& look() const { return m_look; }

private:
    void takeLook();
    void follow(IHeldRows& rows) const;

    ClockSource const m_clocks;
    ClockJudge m_judge;
    ClockLook m_look;
    std::int64_t m_step = 0;   // between the last look that was done and this one, if records were held then
    std::int64_t m_offset = 0; // at the last look that was done, as is the next
    bool m_held = false;
};

} // namespace velmora
