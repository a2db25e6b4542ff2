#include "libvelmora/channel/adapterstate.h"

#include <algorithm>

namespace velmora {

namespace {

constexpr std::string_view protocolSetting = "ATTP";

} // namespace

void AdapterState::observe(ElmCommand const& command, std::string const& reply)
{
    std::string const answer = compactText(reply);
    bool const confirmed = answer.find("OK") != std::string::npos;
    if (command.resets() || (command.text() == "ATD" && confirmed)) {
        *this = AdapterState();
    } else if (command.text() == "ATI" && !answer.empty()) {
        m_identity = answer.starts_with("ATI") ? answer.substr(3) : answer;
    } else if (command.text() == "ATDPN") {
        std::size_t const digit = answer.find_first_of("123456789");
        m_protocol = digit != std::string::npos ? answer[digit] - '0' : m_protocol;
    }
    std::optional<std::string> const word = command.setting();
    if (!word || !confirmed) {
        return;
    }
    if (command.startsWith("ATE") || command.startsWith("ATH")) {
        (command.startsWith("ATE") ? m_echoOff : m_headers) = command.text().ends_with(word == "ATE" ? '0' : '1');
    } else if (*word == protocolSetting) {
        int const number = hexDigitValue(command.text().back());
        m_protocol = busKindOf(number) != BusKind::Unknown ? number : 0;
    }
    auto const known = std::find_if(m_settings.begin(), m_settings.end(),
                                    [&word](auto const& setting) { return setting.first == *word; });
    if (known != m_settings.end()) {
        known->second = command.text();
    } else {
        m_settings.emplace_back(*word, command.text());
    }
}

std::string AdapterState::setting(std::string const& word) const
{
    auto const known = std::find_if(m_settings.begin(), m_settings.end(),
                                    [&word](auto const& setting) { return setting.first == word; });
    return known != m_settings.end() ? known->second : std::string();
}

// A bus that was found by a search is taken by its number: the search has been done.
std::vector<std::string> AdapterState::setUp() const
{
    std::vector<std::string> commands;
    for (auto const& [word, command] : m_settings) {
        bool const found = word == protocolSetting && m_protocol != 0;
        commands.push_back(found ? std::string(protocolSetting) + static_cast<char>('0' + m_protocol) : command);
    }
    return commands;
}

} // namespace velmora
