#include "libvelmora/record/dialoguerecorder.h"

#include "simulator/bytes.h"

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

// Shorter ones come of the line and the system. They are not lost: they add up until they make one that counts.
constexpr obdsim::Time shortestPause = obdsim::Ms(20);

// The channel takes no longer reply. An adapter that floods must not fill the memory.
constexpr std::size_t longestReply = 1U << 20U;

bool asks(obdsim::Exchange const& exchange, char const* command)
{
    return obdsim::normaliseCommand(exchange.sent) == command;
}

// The number that the adapter told last, behind an A if it searched for the bus; 0 if it told none.
int protocolOf(std::vector<obdsim::Exchange> const& exchanges)
{
    int number = 0;
    for (obdsim::Exchange const& exchange : exchanges) {
        std::string const reply = asks(exchange, "ATDPN") ? exchange.received() : std::string();
        std::size_t const digit = reply.find_first_of("123456789");
        number = digit != std::string::npos ? reply[digit] - '0' : number;
    }
    return number;
}

} // namespace

void DialogueRecorder::onSent(std::string_view bytes)
{
    std::lock_guard const lock(m_mutex);
    m_told = Clock::now();
    for (char const character : bytes) {
        if (character == '\r') {
            m_dialogue.exchanges.push_back({std::exchange(m_line, {}), {}});
            m_room = longestReply;
        } else {
            m_line += character;
        }
    }
}

void DialogueRecorder::onReceived(std::string_view bytes)
{
    std::lock_guard const lock(m_mutex);
    bytes = bytes.substr(0, m_room);
    if (bytes.empty()) {
        return;
    }
    m_room -= bytes.size();
    obdsim::Time const pause = pauseUntil(Clock::now());
    auto& chunks = m_dialogue.exchanges.back().chunks;
    if (chunks.empty() || pause != obdsim::Time(0)) {
        chunks.push_back({pause, {}});
    }
    chunks.back().bytes += bytes;
}

obdsim::Time DialogueRecorder::pauseUntil(Clock::time_point now)
{
    auto const pause = std::chrono::duration_cast<obdsim::Time>(now - m_told);
    if (pause < shortestPause) {
        return obdsim::Time(0);
    }
    m_told = now;
    return pause;
}

obdsim::Dialogue DialogueRecorder::dialogue() const
{
    std::lock_guard const lock(m_mutex);
    obdsim::Dialogue dialogue = m_dialogue;
    dialogue.raw = true;
    dialogue.protocol = protocolOf(dialogue.exchanges);
    bool const headersOn = std::any_of(dialogue.exchanges.begin(), dialogue.exchanges.end(),
                                       [](auto const& exchange) { return asks(exchange, "ATH1"); });
    dialogue.headers = headersOn ? obdsim::DialogueHeaders::Late : obdsim::DialogueHeaders::Off;
    return dialogue;
}

std::vector<std::string> DialogueRecorder::sentFrom(std::size_t first) const
{
    std::lock_guard const lock(m_mutex);
    std::vector<std::string> sent;
    for (std::size_t i = first; i < m_dialogue.exchanges.size(); ++i) {
        sent.push_back(m_dialogue.exchanges[i].sent);
    }
    return sent;
}

} // namespace velmora
