#include "simulator/replayscript.h"

#include <algorithm>

namespace obdsim {

namespace {

constexpr char const* errorWords[] = {"NODATA", "UNABLE", "ERROR", "BUSBUSY", "BUFFERFULL", "STOPPED", "?"};

/// Requests are the same with and without the digit that tells how many answers
/// to wait for.
std::string keyOf(std::string const& normalised)
{
    bool const counted = isHexText(normalised) && normalised.size() > 2 && normalised.size() % 2 != 0;
    return counted ? normalised.substr(0, normalised.size() - 1) : normalised;
}

bool isAnswerOfCar(std::string const& key, std::string const& reply)
{
    std::string const text = normaliseCommand(reply);
    bool const failed = std::any_of(std::begin(errorWords), std::end(errorWords),
                                    [&](char const* word) { return text.find(word) != std::string::npos; });
    return isHexText(key) && !failed && text.find_first_of("0123456789") != std::string::npos;
}

bool isProtocolQuestion(std::string const& key)
{
    return key == "ATDPN" || key == "ATDP" || key == "ATN";
}

std::string withoutEcho(std::string const& bytes, std::string const& sent)
{
    auto const end = bytes.find('\r');
    bool const echoed = end != std::string::npos && !sent.empty() && normaliseCommand(bytes.substr(0, end)) == sent;
    return echoed ? bytes.substr(end + 1) : bytes;
}

/// The first line of a reply that is long enough to be the name of an adapter.
std::string firstName(std::string const& reply)
{
    constexpr std::size_t shortestName = 5;
    std::string line;
    for (char const character : reply + '\r') {
        bool const printable = character >= ' ' && character < '\x7F' && character != '>';
        if (printable) {
            line += character;
            continue;
        }
        if (line.size() >= shortestName) {
            return line;
        }
        line.clear();
    }
    return "";
}

/// "ELM327 v2.3" out of a description such as "clone, ELM327 v2.3 on USB".
std::string elmName(std::string const& description)
{
    auto const from = description.find("ELM327 v");
    if (from == std::string::npos) {
        return "";
    }
    auto const blank = description.find_first_of(" ,", from + std::string("ELM327 v").size());
    return description.substr(from, blank == std::string::npos ? blank : blank - from);
}

/// Without the notices that an adapter gives while it looks for the bus.
std::string withoutSearchNotice(std::string bytes)
{
    for (std::string const notice : {"SEARCHING...", "BUS INIT: ...OK", "BUS INIT: OK"}) {
        auto const at = bytes.find(notice);
        if (at != std::string::npos) {
            auto const end = bytes.find_first_not_of("\r\n", at + notice.size());
            bytes.erase(at, (end == std::string::npos ? bytes.size() : end) - at);
        }
    }
    return bytes;
}

/// What is missing of an empty line and the prompt.
std::string missingEnd(std::string const& bytes)
{
    if (bytes.find('>') != std::string::npos) {
        return "";
    }
    auto const last = bytes.find_last_not_of('\r');
    std::size_t const returns = bytes.size() - (last == std::string::npos ? 0 : last + 1);
    return (returns == 0 ? "\r\r>" : returns == 1 ? "\r>" : ">");
}

} // namespace

ReplayScript::ReplayScript(Dialogue const& dialogue) : m_dialogue(dialogue)
{
    addRows();
    findProtocol();
}

void ReplayScript::addRows()
{
    bool headersOn = m_dialogue.headers == DialogueHeaders::On;
    bool beforeBus = true;
    std::string key;
    for (auto const& exchange : m_dialogue.exchanges) {
        std::string const command = normaliseCommand(exchange.sent);
        key = command.empty() ? key : keyOf(command); // an empty line repeats the last command
        m_rows.push_back({key, &exchange, headersOn, beforeBus});
        if (m_dialogue.headers == DialogueHeaders::Late && (key == "ATH1" || key == "ATH0")) {
            headersOn = key == "ATH1";
        }
        beforeBus = beforeBus && !isAnswerOfCar(key, exchange.received());
    }
}

void ReplayScript::findProtocol()
{
    m_protocol = m_dialogue.protocol;
    for (auto const& row : m_rows) {
        std::string const reply = row.key == "ATDPN" ? row.exchange->received() : "";
        auto const digit = reply.find_first_of("123456789");
        if (m_protocol == 0 && digit != std::string::npos) {
            m_protocol = reply[digit] - '0';
        }
    }
}

std::optional<std::vector<TimedText>> ReplayScript::toCommand(std::string const& command, Settings const& settings)
{
    return serve(command, settings);
}

std::optional<std::vector<TimedText>> ReplayScript::toRequest(std::string const& request, Settings const& settings,
                                                              BusLink& bus)
{
    bool const otherProtocol = !bus.automatic() && m_protocol != 0 && bus.number() != m_protocol;
    if (otherProtocol) {
        return std::nullopt;
    }
    std::string const key = keyOf(request);
    auto reply = serve(key, settings);
    if (!reply) {
        return std::vector<TimedText>{{settings.timeout(), isHexText(key) ? "NO DATA\r\r>" : "?\r\r>"}};
    }
    std::string all;
    for (auto const& part : *reply) {
        all += part.text;
    }
    if (isAnswerOfCar(key, all)) {
        m_busServed = true;
        bus.assume(m_protocol);
    }
    return reply;
}

std::string ReplayScript::banner() const
{
    for (auto const& row : m_rows) {
        if (row.key == "ATI" || row.key == "ATZ" || row.key == "ATWS") {
            std::string name = firstName(withoutEcho(row.exchange->received(), row.key));
            if (!name.empty()) {
                return name;
            }
        }
    }
    return elmName(m_dialogue.adapter);
}

std::optional<std::vector<TimedText>> ReplayScript::serve(std::string const& key, Settings const& settings)
{
    std::vector<Row const*> rows;
    for (auto const& row : m_rows) {
        if (fits(row, key, settings)) {
            rows.push_back(&row);
        }
    }
    if (rows.empty()) {
        return std::nullopt;
    }
    bool const separate = m_dialogue.headers == DialogueHeaders::Late && settings.headers && isHexText(key);
    std::size_t& next = m_served[{key, separate}];
    bool const repeated = next >= rows.size();
    Row const& row = *rows[std::min(next, rows.size() - 1)];
    ++next;
    auto reply = texts(row, settings);
    for (auto& part : reply) {
        part.text = repeated && !m_dialogue.raw ? withoutSearchNotice(part.text) : part.text;
    }
    return reply;
}

bool ReplayScript::fits(Row const& row, std::string const& key, Settings const& settings) const
{
    bool const hidden =
        m_dialogue.headers == DialogueHeaders::Late && isHexText(key) && settings.headers && !row.headersOn;
    bool const outdated = isProtocolQuestion(key) && m_busServed && row.beforeBus;
    return row.key == key && !hidden && !outdated;
}

std::vector<TimedText> ReplayScript::texts(Row const& row, Settings const& settings) const
{
    std::vector<TimedText> result;
    Time delay{};
    std::string all;
    for (auto const& chunk : row.exchange->chunks) {
        delay += chunk.pause;
        bool const first = result.empty();
        bool const cutEcho = first && (settings.echo || !m_dialogue.raw);
        result.push_back(
            {delay, cutEcho ? withoutEcho(chunk.bytes, normaliseCommand(row.exchange->sent)) : chunk.bytes});
        all += chunk.bytes;
    }
    if (!m_dialogue.raw) {
        result.push_back({delay, missingEnd(all)});
    }
    return result;
}

} // namespace obdsim
