#include "program/terminal/interrupt.h"

#include "program/exitcode.h"

#include <csignal>
#include <pthread.h>
#include <unistd.h>
#include <utility>

namespace velmora::cli {

namespace {

Interrupt* current = nullptr;

sigset_t endingSignals()
{
    sigset_t signals;
    sigemptyset(&signals);
    sigaddset(&signals, SIGINT);
    sigaddset(&signals, SIGTERM);
    sigaddset(&signals, SIGHUP);
    return signals;
}

} // namespace

Interrupt::Interrupt()
{
    current = this;
    sigset_t const signals = endingSignals();
    pthread_sigmask(SIG_BLOCK, &signals, nullptr);
    // A reader that closes its end of a pipe shows as a failed write.
    std::signal(SIGPIPE, SIG_IGN);
    m_thread = std::thread([this] { wait(); });
}

Interrupt::~Interrupt()
{
    m_stop = true;
    // NOLINTNEXTLINE(bugprone-bad-signal-to-kill-thread): every thread blocks it; it ends the wait of this one
    pthread_kill(m_thread.native_handle(), SIGTERM);
    m_thread.join();
    current = nullptr;
}

Interrupt& Interrupt::instance()
{
    return *current;
}

void Interrupt::wait()
{
    sigset_t const signals = endingSignals();
    int signal = 0;
    while (sigwait(&signals, &signal) == 0 && !m_stop) {
        if (signal == SIGHUP && hangUp()) {
            continue;
        }
        if (m_raised.exchange(true)) {
            endAtOnce();
        }
        std::lock_guard const lock(m_mutex);
        if (m_handler) {
            m_handler();
        }
    }
}

bool Interrupt::hangUp()
{
    std::lock_guard const lock(m_mutex);
    if (m_hangUp) {
        m_hangUp();
    }
    return m_hangUp != nullptr;
}

void Interrupt::setHangUpHandler(std::function<void()> handler)
{
    std::lock_guard const lock(m_mutex);
    m_hangUp = std::move(handler);
}

void Interrupt::endAtOnce()
{
    std::lock_guard const lock(m_lastActMutex);
    if (m_lastAct) {
        m_lastAct();
    }
    ::_exit(static_cast<int>(ExitCode::Interrupted));
}

void Interrupt::setLastAct(std::function<void()> act)
{
    std::lock_guard const lock(m_lastActMutex);
    m_lastAct = std::move(act);
}

void Interrupt::setHandler(std::function<void()> handler)
{
    std::lock_guard const lock(m_mutex);
    m_handler = std::move(handler);
    if (m_handler && m_raised) {
        m_handler();
    }
}

} // namespace velmora::cli
