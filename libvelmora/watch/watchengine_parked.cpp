#include "libvelmora/watch/watchengine.h"

#include <utility>

namespace velmora {

void WatchEngine::stopAsking(WatchTime const& now)
{
    if (std::exchange(m_asking, false)) {
        m_car.stopAsking();
        setIgnition(false, now);
        tell("asleep", "The car is parked: nothing is asked of it any more", now);
    }
}

void WatchEngine::park(WatchTime const& now)
{
    bool const settling = m_judge.state() == SleepJudge::State::Settling;
    m_state = settling ? "settling" : "parked";
    if (settling) {
        return;
    }
    if (m_rules.battery.adapterSleep && !m_sleepless) {
        nap(now);
    } else {
        lookAtVoltage(now);
    }
    followJudge(now);
    if (m_judge.state() == SleepJudge::State::Asking) {
        tell("awake", "The car seems to wake up", now);
    }
}

void WatchEngine::lookAtVoltage(WatchTime const& now)
{
    if (m_judge.wantsVolts(now.steady)) {
        std::optional<double> const volts = m_car.volts();
        onLinkBack(now);
        volts ? m_judge.onVolts(*volts, now.steady) : m_judge.onNoVolts(now.steady);
    }
    if (m_judge.wantsProbe(now.steady)) {
        ++m_probes;
        m_judge.onProbe(m_car.probe(), now.steady);
    }
}

// An adapter that sleeps tells no voltage; one that does not know how to goes on telling it.
void WatchEngine::nap(WatchTime const& now)
{
    if (!m_napping) {
        m_connected = false;
        m_napping = m_car.startNap();
        m_sleepless = !m_napping;
        onLinkBack(now);
        m_napping ? tell("adapter_asleep", "The adapter sleeps until its own triggers wake it", now)
                  : tell("adapter_awake", "The adapter knows no sleep: it is asked for the voltage", now);
    } else if (m_car.napIsOver()) {
        m_napping = false;
        m_judge.wake(now.steady);
    }
}

} // namespace velmora
