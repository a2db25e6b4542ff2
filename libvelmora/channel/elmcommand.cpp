#include "libvelmora/channel/elmcommand.h"

#include <algorithm>
#include <array>
#include <iterator>

namespace velmora {

namespace {

template <std::size_t N>
bool isOneOf(std::string const& text, std::array<std::string_view, N> const& words)
{
    return std::find(words.begin(), words.end(), text) != words.end();
}

} // namespace

int hexDigitValue(char character)
{
    if (character >= '0' && character <= '9') {
        return character - '0';
    }
    if (character >= 'A' && character <= 'F') {
        return character - 'A' + 10;
    }
    return character >= 'a' && character <= 'f' ? character - 'a' + 10 : -1;
}

std::vector<std::uint8_t> digitBytes(std::string_view digits)
{
    std::vector<std::uint8_t> bytes;
    bool const areDigits = std::all_of(digits.begin(), digits.end(), [](char c) { return hexDigitValue(c) >= 0; });
    if (digits.size() % 2 != 0 || !areDigits) {
        return bytes;
    }
    for (std::size_t i = 0; i < digits.size(); i += 2) {
        bytes.push_back(static_cast<std::uint8_t>(hexDigitValue(digits[i]) << 4 | hexDigitValue(digits[i + 1])));
    }
    return bytes;
}

std::string compactText(std::string_view line)
{
    std::string text;
    for (char const character : line) {
        if (character > ' ') {
            text += character >= 'a' && character <= 'z' ? static_cast<char>(character - 'a' + 'A') : character;
        }
    }
    return text;
}

ElmCommand::ElmCommand(std::string_view line) : m_text(compactText(line)), m_request(digitBytes(m_text)) {}

bool ElmCommand::onlyReads() const
{
    constexpr unsigned int reading[] = {0x01, 0x02, 0x03, 0x05, 0x06, 0x07, 0x09, 0x0A, 0x19, 0x1A, 0x21, 0x22};
    return std::find(std::begin(reading), std::end(reading), service()) != std::end(reading);
}

// Each PID of service 01 has one length. Of service 09 these items have; the others are a maker's own.
bool ElmCommand::hasFixedShape() const
{
    constexpr std::size_t mostBytes = 7; // an adapter takes no more with a count behind them
    constexpr std::uint8_t lastItem = 0x0F;
    if (m_request.size() < 2 || m_request.size() > mostBytes) {
        return false;
    }
    return service() == 0x01 || (service() == 0x09 && m_request.size() == 2 && m_request[1] <= lastItem);
}

bool ElmCommand::asksForMask() const
{
    bool const hasMasks = service() == 0x01 || service() == 0x06 || service() == 0x08 || service() == 0x09;
    return hasMasks && m_request.size() == 2 && (m_request[1] & 0x1FU) == 0;
}

bool ElmCommand::onlyAsks() const
{
    constexpr std::array<std::string_view, 12> questions = {"ATI",   "AT@1", "AT@2",  "ATDP", "ATDPN", "ATRV",
                                                            "ATIGN", "ATCS", "ATPPS", "STI",  "STDI",  "ATKW"};
    return isOneOf(m_text, questions);
}

bool ElmCommand::monitors() const
{
    return startsWith("ATMA") || startsWith("ATMR") || startsWith("ATMT") || startsWith("ATMP") || startsWith("STM");
}

std::optional<std::string> ElmCommand::setting() const
{
    // Longer words first: each is also the beginning of what it stands before.
    constexpr std::string_view settings[] = {"ATCAF", "ATCFC", "ATCRA", "ATCEA", "ATCP", "ATCF", "ATCM",
                                             "ATAT",  "ATAL",  "ATST",  "ATSH",  "ATSP", "ATTP", "ATE",
                                             "ATL",   "ATS",   "ATM",   "ATH",   "ATR"};
    if (onlyAsks() || resets() || monitors() || startsWith("ATRV") || startsWith("ATRD") || startsWith("ATLP")) {
        return std::nullopt;
    }
    for (std::string_view const word : settings) {
        if (startsWith(word)) {
            return word == "ATSP" ? std::string("ATTP") : std::string(word); // both choose the protocol
        }
    }
    return std::nullopt;
}

} // namespace velmora
