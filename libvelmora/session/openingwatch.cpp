#include "libvelmora/session/openingwatch.h"

#include "common/text/text.h"

#include <vector>

namespace velmora {

namespace {

std::string withoutBlanks(std::string text)
{
    std::erase(text, ' ');
    return toUpper(text);
}

// Of a command that chooses a protocol: ATTPn tries it, ATSPn sets it. 0 lets the adapter search.
std::string protocolPhase(std::string const& command)
{
    std::string const number = command.substr(4);
    return number == "0" || number == "00" ? "Searching for the bus" : "Trying protocol " + number;
}

} // namespace

void OpeningWatch::onDataSent(std::vector<unsigned char> const& data)
{
    std::vector<std::string> const lines = adapterLines({data.begin(), data.end()});
    std::lock_guard const lock(m_mutex);
    m_command = lines.empty() ? std::string() : withoutBlanks(lines.front());
    m_answered = false;
    if (m_command.size() > 4 && (m_command.starts_with("ATTP") || m_command.starts_with("ATSP"))) {
        m_phase = protocolPhase(m_command);
    }
}

void OpeningWatch::onDataReceived(std::vector<unsigned char> const& data)
{
    std::vector<std::string> const lines = adapterLines({data.begin(), data.end()});
    std::lock_guard const lock(m_mutex);
    m_answered = true;
    for (std::string const& line : lines) {
        std::string const plain = withoutBlanks(line);
        if (plain == m_command) {
            continue; // its echo
        }
        if (m_command == "ATI" && m_identification.empty()) {
            m_identification = readable(line);
            m_phase = m_identification + " answered";
        }
        m_headersMissing = m_headersMissing || (m_command.starts_with("0100") && plain.starts_with("4100"));
    }
}

std::string OpeningWatch::phase() const
{
    std::lock_guard const lock(m_mutex);
    return m_phase;
}

std::string OpeningWatch::identification() const
{
    std::lock_guard const lock(m_mutex);
    return m_identification;
}

std::string OpeningWatch::unanswered() const
{
    std::lock_guard const lock(m_mutex);
    return m_answered ? std::string() : m_command;
}

bool OpeningWatch::headersMissing() const
{
    std::lock_guard const lock(m_mutex);
    return m_headersMissing;
}

} // namespace velmora
