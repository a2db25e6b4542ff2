#include "simulator/adapter/adapter.h"

#include <algorithm>

namespace obdsim {

namespace {

constexpr Time slowPrompt = Ms(250);

} // namespace

bool Adapter::playScript(std::optional<std::vector<TimedText>> const& texts)
{
    if (!texts) {
        return false;
    }
    for (auto const& part : *texts) {
        sayRaw(m_profile.timing.command + part.delay, part.text);
    }
    return true;
}

void Adapter::answer(CommandReply const& reply)
{
    Time const delay = m_profile.timing.command + reply.delay;
    if (reply.after == After::Monitor) {
        m_state = State::Monitoring;
        return;
    }
    for (auto const& text : reply.lines) {
        say(delay, text + "\r");
    }
    if (reply.after == After::BaudRate) {
        answerBaudRate();
        return;
    }
    finish(delay);
    if (reply.after == After::Sleep) {
        m_state = State::Asleep;
    }
}

void Adapter::answerReset(CommandReply const& reply)
{
    Time const delay = m_profile.timing.command + reply.delay;
    if (has(Quirk::QuestionBeforeBanner)) {
        say(delay, "?\r");
    }
    sayRaw(delay, has(Quirk::JunkBeforeBanner) ? "\xFC" : "");
    say(delay, "\r\r" + reply.lines.front() + "\r");
    finish(delay);
    if (has(Quirk::DoublePrompt)) {
        finish(delay);
    }
    for (int i = 0; i < 10 && has(Quirk::LeftoverQuestions); ++i) {
        say(delay, "?\r");
        finish(delay);
    }
    m_state = State::Deaf;
    m_stateUntil = m_now + delay;
}

/// ATBRD: OK at the old rate, the identity at the new one, then a CR from the
/// host within ATBRT proves that it can read it. Without one the adapter goes
/// back to the old rate and its prompt.
void Adapter::answerBaudRate()
{
    constexpr Time switching = Ms(10);
    say(m_profile.timing.command + switching, m_profile.banner + "\r");
    Time const wait = m_profile.timing.command + switching + m_settings.baudWait;
    finish(wait);
    m_state = State::AwaitingRate;
    m_stateUntil = m_now + wait;
}

void Adapter::confirmRate()
{
    m_output.clear();
    m_state = State::Ready;
    say(m_profile.timing.command, "OK\r");
    finish(m_profile.timing.command);
}

/// The end of a reply: an empty line and the prompt.
void Adapter::finish(Time delay)
{
    Time const prompt = delay + (has(Quirk::PromptSlow) ? slowPrompt : Time(0));
    say(prompt, has(Quirk::SingleReturn) ? "" : "\r");
    sayRaw(prompt, m_promptLost ? "" : ">");
}

void Adapter::say(Time delay, std::string const& text)
{
    if (!m_settings.linefeeds) {
        sayRaw(delay, text);
        return;
    }
    std::string withFeeds;
    for (char const character : text) {
        withFeeds += character;
        withFeeds += character == '\r' ? "\n" : "";
    }
    sayRaw(delay, withFeeds);
}

void Adapter::sayRaw(Time delay, std::string const& text)
{
    constexpr std::size_t piece = 5;
    constexpr Time gap = Ms(15);
    if (!has(Quirk::Pieces)) {
        m_output.push(m_now + delay, text);
        return;
    }
    for (std::size_t at = 0; at < text.size(); at += piece) {
        m_output.push(std::max(m_now + delay, m_output.end(m_now)) + gap, text.substr(at, piece));
    }
}

} // namespace obdsim
