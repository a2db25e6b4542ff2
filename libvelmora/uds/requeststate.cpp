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
        break;
    case ModuleAnswer::Kind::Refused:
        m_silent = 0;
        takeRefusal(answer.code, now);
        break;
    case ModuleAnswer::Kind::NotReached:
    case ModuleAnswer::Kind::NotSent:
        end();
        break;
    case ModuleAnswer::Kind::Silent:
    case ModuleAnswer::Kind::Foreign:
    case ModuleAnswer::Kind::Unreadable:
    case ModuleAnswer::Kind::BusTrouble:
        // Silence ends nothing, for the module may wake; but it must not hold up the others.
        if (++m_silent >= mostSilent) {
            m_notBefore = now + conditionsPause;
        }
        break;
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
        end();
        break;
    case RefusalAction::RetryLater:
        m_notBefore = now + conditionsPause;
        break;
    case RefusalAction::RetrySoon:
        m_notBefore = now + (++m_busy <= mostBusy ? std::chrono::milliseconds(busyPause)
                                                  : std::chrono::milliseconds(conditionsPause));
        m_busy = m_busy > mostBusy ? 0 : m_busy;
        break;
    case RefusalAction::Split:
        m_split = true;
        countFailure();
        break;
    case RefusalAction::Wait: // even with the longest wait nothing came
        m_notBefore = now + conditionsPause;
        break;
    case RefusalAction::StopAfterThree:
        countFailure();
        break;
    }
}

void RequestState::countFailure()
{
    if (++m_failures >= mostRefusals) {
        end();
    }
}

} // namespace velmora
