#include "libvelmora/uds/requeststate.h"

#include "libvelmora/uds/refusalcode.h"

namespace velmora {

namespace {

constexpr std::chrono::seconds conditionsPause{30};
constexpr std::chrono::milliseconds busyPause{200};
constexpr int mostBusy = 3;
constexpr int mostRefusals = 3;
constexpr int mostSilent = 3;

} // namespace

void RequestState::take(ModuleAnswer const& answer, Time now)
{
    m_reason = describe(answer);
    switch (answer.kind) {
    case ModuleAnswer::Kind::Positive:
        *this = RequestState();
        return;
    case ModuleAnswer::Kind::Refused:
        m_silent = 0;
        return takeRefusal(answer.code, now);
    case ModuleAnswer::Kind::NotReached:
    case ModuleAnswer::Kind::NotSent:
        return end();
    case ModuleAnswer::Kind::Silent:
    case ModuleAnswer::Kind::Foreign:
    case ModuleAnswer::Kind::Unreadable:
    case ModuleAnswer::Kind::BusTrouble:
        return countSilence(now);
    }
}

// Silence ends nothing, for the module may wake; but it must not hold up the others.
void RequestState::countSilence(Time now)
{
    if (++m_silent >= mostSilent) {
        m_notBefore = now + conditionsPause;
    }
}

void RequestState::takeRefusal(unsigned char code, Time now)
{
    RefusalAction const action = refusalAction(code);
    if (action != RefusalAction::RetrySoon) {
        m_busy = 0;
    }
    switch (action) {
    case RefusalAction::StopAbsent:
    case RefusalAction::StopLocked:
    case RefusalAction::StopSession:
        return end();
    case RefusalAction::RetryLater:
    case RefusalAction::Wait: // even with the longest wait nothing came
        m_notBefore = now + conditionsPause;
        return;
    case RefusalAction::RetrySoon:
        return countBusy(now);
    case RefusalAction::Split:
        m_split = true;
        return countFailure();
    case RefusalAction::StopAfterThree:
        return countFailure();
    }
}

void RequestState::countBusy(Time now)
{
    if (++m_busy <= mostBusy) {
        m_notBefore = now + busyPause;
        return;
    }
    m_notBefore = now + conditionsPause;
    m_busy = 0;
}

void RequestState::countFailure()
{
    if (++m_failures >= mostRefusals) {
        end();
    }
}

} // namespace velmora
