// What a whole line does: a command of the adapter's own, or a request to the bus.

#include "simulator/adapter/adapter.h"

#include <utility>

namespace obdsim {

namespace {

/// Data bytes that a request may have (ELM327 data sheet v1.4b, page 28): seven, or eight after ATAL or with PCI byte.
std::size_t longestRequest(Settings const& settings)
{
    return settings.longMessages || !settings.formatting ? 8 : 7;
}

/// The digit behind a request that tells how many responses to wait for came with v1.3.
bool knowsCount(AdapterProfile const& profile)
{
    constexpr int since = 130;
    return profile.family != AdapterFamily::Elm || profile.level >= since;
}

std::string chipCommand(std::string const& line)
{
    return line.substr(0, 2);
}

} // namespace

void Adapter::execute(std::string const& line)
{
    std::string command = normaliseCommand(line);
    bool const first = std::exchange(m_firstCommand, false);
    if (first && has(Quirk::FirstSwallowed)) {
        return;
    }
    m_promptLost = first && has(Quirk::FirstPromptLost);
    if (first && has(Quirk::StoppedFirst)) {
        answer(obdsim::line("STOPPED"));
        return;
    }
    if (command.empty()) {
        command = m_last;
    }
    if (command.empty() || line.size() > longestLine) {
        answer(refused());
        return;
    }
    m_last = command;
    m_requests.add(m_now, command);
    if (command.compare(0, 2, "AT") == 0) {
        executeCommand(command);
    } else if (chipCommand(command) == "ST" || chipCommand(command) == "VT") {
        answerChip(command);
    } else {
        executeRequest(command);
    }
}

void Adapter::executeCommand(std::string const& command)
{
    Settings const before = m_settings;
    CommandReply const reply = run(command);
    if (playScript(m_script ? m_script->toCommand(command, before) : std::nullopt)) {
        return;
    }
    if (reply.after == After::Reset) {
        m_last.clear();
        answerReset(reply);
        return;
    }
    if (command == "ATE0" && has(Quirk::PromptLate)) {
        say(m_profile.timing.command, reply.lines.front());
        m_heldBack = "\r\r>";
        return;
    }
    answer(reply);
}

CommandReply Adapter::run(std::string const& command)
{
    CommandContext context{m_profile, m_settings, m_bus, m_now};
    if (auto const call = findCommand(m_profile, command.substr(2))) {
        return call->command->handler(context, call->argument);
    }
    return has(Quirk::OkToAll) ? ok() : refused();
}

/// Commands of the STN chips, which begin with ST, and of the programs on them.
void Adapter::answerChip(std::string const& command)
{
    if (playScript(m_script ? m_script->toCommand(command, m_settings) : std::nullopt)) {
        return;
    }
    if (m_profile.family != AdapterFamily::Stn || chipCommand(command) == "VT") {
        answer(refused());
    } else {
        answer(command == "STI" ? line(m_profile.chip) : ok());
    }
}

void Adapter::executeRequest(std::string const& request)
{
    if (playScript(m_script ? m_script->toRequest(request, m_settings, m_bus) : std::nullopt)) {
        return;
    }
    bool const counted = request.size() % 2 != 0;
    auto const data = parseHex(counted ? request.substr(0, request.size() - 1) : request);
    auto const count = counted ? parseHexNumber(request.substr(request.size() - 1)) : std::nullopt;
    bool const countRefused = counted && (!count || has(Quirk::NoCountDigit) || !knowsCount(m_profile));
    if (!data || data->empty() || data->size() > longestRequest(m_settings) || countRefused) {
        answer(refused());
        return;
    }
    BusRequest busRequest{*data, std::nullopt};
    if (count) {
        busRequest.expected = static_cast<int>(*count);
    }
    BusReply const reply = m_bus.request(busRequest, m_settings, m_now + m_profile.timing.command);
    for (auto const& part : reply.texts) {
        say(m_profile.timing.command + part.delay, part.text);
    }
    m_state = State::Busy;
    m_stateUntil = m_now + m_profile.timing.command + reply.end;
    bool const goesOn = has(Quirk::BusInitSplit) && !reply.texts.empty() && reply.texts.back().text == "OK\r";
    if (!goesOn) {
        finish(m_profile.timing.command + reply.end);
    }
}

} // namespace obdsim
