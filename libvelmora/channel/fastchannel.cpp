#include "libvelmora/channel/fastchannel.h"

#include <algorithm>
#include <limits>
#include <utility>

namespace velmora {

namespace {

// For a second piece behind a prompt, which some adapters send; at 9600 baud it is one character's time. Those that do
// show it soon.
constexpr WireTime grace{1};
constexpr int enoughGraces = 4;
// A sender waits for the exchange of another thread no longer than for a late prompt.
constexpr WireTime longestTurn{6000};
constexpr WireTime turnSlice{100};

} // namespace

FastChannel::FastChannel(std::shared_ptr<IWire> wire, ChannelOptions options, std::shared_ptr<LearntStore> store)
    : m_wire(std::move(wire)), m_options(std::move(options)), m_store(std::move(store)), m_returns(m_options.returns)
{
    if (!m_options.counting) {
        m_learner.switchOff();
    }
}

FastChannel::~FastChannel()
{
    leaveNoAddress();
    strikeNote();
    keepLearnt();
}

bool FastChannel::receive(std::vector<unsigned char>& out, int timeoutMs)
{
    if (m_sleepAnswered.exchange(false)) {
        constexpr std::string_view answer = "OK\r";
        out.assign(answer.begin(), answer.end());
        return true;
    }
    WireTime const timeout(std::max(timeoutMs, 0));
    std::unique_lock lock(m_exchange, timeout);
    if (!lock.owns_lock()) {
        return false;
    }
    // With nothing outstanding nothing can come, but for an adapter that is just starting.
    bool const idle = !m_pending && m_begun && !m_starting;
    bool const prepared = !m_ready.empty();
    bool const hurries = m_vainGraces >= enoughGraces && m_habits[static_cast<std::size_t>(Habit::StaleReply)] == 0;
    WireTime const latency = m_pending ? std::exchange(m_pending->latency, WireTime(0)) : WireTime(0);
    WireTime const patience = !idle ? timeout + latency : hurries ? WireTime(0) : std::min(timeout, grace);
    if (idle && !prepared && hurries && timeoutMs <= 0) {
        return false; // the next command finds what was said meanwhile
    }
    WireTime const end = m_wire->now() + patience;
    takeReplies();
    while (m_ready.empty() && isValid()) {
        std::string const bytes = listen(m_pending ? std::min({end, remedyTime(), cutTime()}) : end);
        hear(bytes);
        if (!bytes.empty()) {
            continue;
        }
        if (m_pending && m_wire->now() >= remedyTime()) {
            remedy();
        } else if (m_pending && m_wire->now() >= cutTime()) {
            cutWait();
        } else if (m_wire->now() >= end) {
            break;
        }
    }
    publish();
    if (m_ready.empty()) {
        m_vainGraces += idle && patience > WireTime(0) ? 1 : 0;
        return false;
    }
    m_vainGraces = idle && !prepared ? std::numeric_limits<int>::min() : m_vainGraces;
    out.assign(m_ready.front().begin(), m_ready.front().end());
    m_ready.pop_front();
    return true;
}

void FastChannel::send(std::vector<unsigned char> const& bytes)
{
    std::string text(bytes.begin(), bytes.end());
    std::erase(text, '\r');
    bool const sleep = compactText(text) == "ATLP" && !m_options.sleepAtEnd;
    std::unique_lock lock(m_exchange, std::defer_lock);
    for (WireTime waited{0}; !lock.owns_lock() && isValid() && waited < longestTurn; waited += turnSlice) {
        // The farewell needs no turn: the adapter is not told.
        if (lock.try_lock_for(turnSlice) || sleep) {
            break;
        }
    }
    if (sleep) {
        if (lock.owns_lock() && !m_pending) {
            endStay();
            strikeNote();
            giveWaitBack();
            keepLearnt();
        }
        m_sleepAnswered = true;
        return;
    }
    if (!lock.owns_lock() || !isValid()) {
        return;
    }
    if (m_pending) {
        settle();
    }
    m_ready.clear();
    if (isValid()) {
        begin(text);
    }
    publish();
}

void FastChannel::addLogger(obd::IConnectionLogger* logger)
{
    std::lock_guard const lock(m_loggerMutex);
    m_loggers.push_back(logger);
}

void FastChannel::removeLogger(obd::IConnectionLogger* logger)
{
    std::lock_guard const lock(m_loggerMutex);
    auto const found = std::find(m_loggers.begin(), m_loggers.end(), logger);
    if (found != m_loggers.end()) {
        m_loggers.erase(found);
    }
}

void FastChannel::tellSent(std::string const& bytes)
{
    std::lock_guard const lock(m_loggerMutex);
    for (obd::IConnectionLogger* logger : m_loggers) {
        logger->onDataSent({bytes.begin(), bytes.end()});
    }
}

void FastChannel::tellReceived(std::string const& bytes)
{
    std::lock_guard const lock(m_loggerMutex);
    for (obd::IConnectionLogger* logger : m_loggers) {
        logger->onDataReceived({bytes.begin(), bytes.end()});
    }
}

void FastChannel::onConnected()
{
    m_connected = true;
}

ChannelStatistics FastChannel::statistics() const
{
    std::lock_guard const lock(m_sharedMutex);
    return m_statistics;
}

// Behind each step, so that who asks never waits for an exchange.
void FastChannel::publish()
{
    constexpr double stepMs = 4.096;
    m_working.habits = m_habits;
    m_working.adapterSilent = isSilent();
    m_working.unanswered = m_pending.has_value();
    m_working.trouble = m_trouble;
    m_working.countingWorks = m_learner.works();
    m_working.countingOff = m_learner.isOff();
    m_working.slowestReplyMs = static_cast<unsigned int>(m_slowest.count());
    if (m_waitSteps != 0) {
        m_working.waitMs = static_cast<unsigned int>(m_waitSteps * stepMs);
    }
    std::lock_guard const lock(m_sharedMutex);
    m_statistics = m_working;
}

} // namespace velmora
