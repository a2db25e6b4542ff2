#include "libvelmora/record/vinmask.h"

#include "simulator/bus/checksum.h"
#include "simulator/bus/protocol.h"
#include "simulator/bytes.h"

#include <algorithm>
#include <map>
#include <set>
#include <string>
#include <vector>

namespace velmora {

namespace {

using obdsim::Bytes;

constexpr std::size_t maskedCharacters = 6;
constexpr std::uint8_t zero = '0';

// A line of a reply that holds nothing but digits and blanks, and where its digits stand.
class Line
{
public:
    Line(std::string& reply, std::size_t begin, std::size_t end) : m_reply(reply)
    {
        for (std::size_t i = begin; i < end; ++i) {
            if (obdsim::isHexDigit(reply[i])) {
                m_digits.push_back(i);
            } else if (reply[i] != ' ') {
                m_digits.clear();
                return;
            }
        }
    }

    std::string text(std::size_t digits) const
    {
        std::string result;
        for (std::size_t i = 0; i < digits && i < m_digits.size(); ++i) {
            result += m_reply[m_digits[i]];
        }
        return result;
    }

    // The whole bytes behind so many digits.
    Bytes bytes(std::size_t behind) const
    {
        std::string rest = text(m_digits.size());
        rest = behind < rest.size() ? rest.substr(behind) : std::string();
        rest.resize(rest.size() / 2 * 2);
        return obdsim::parseHex(rest).value_or(Bytes());
    }

    void put(std::size_t behind, std::size_t index, std::uint8_t byte)
    {
        std::string const digits = obdsim::hexByte(byte);
        m_reply[m_digits[behind + 2 * index]] = digits[0];
        m_reply[m_digits[behind + 2 * index + 1]] = digits[1];
    }

private:
    std::string& m_reply;
    std::vector<std::size_t> m_digits;
};

std::vector<Line> linesOf(std::string& reply)
{
    std::vector<Line> lines;
    std::size_t begin = 0;
    while (begin < reply.size()) {
        std::size_t const end = std::min(reply.find_first_of("\r\n>", begin), reply.size());
        lines.emplace_back(reply, begin, end);
        begin = end + 1;
    }
    return lines;
}

bool holdsVin(Bytes const& bytes, std::size_t at)
{
    return bytes.size() > at + 1 && bytes[at] == 0x49 && bytes[at + 1] == 0x02;
}

// What was found of identification numbers, and masked.
struct Masked
{
    std::size_t headings = 0; // lines with 49 02
    std::size_t modules = 0;
    std::size_t characters = 0;

    bool complete(std::size_t headingsInAll) const
    {
        return headings == headingsInAll && characters >= modules * maskedCharacters;
    }
};

// ISO 15765-2: the number comes in a first frame and consecutive ones, its characters end with the message.
Masked maskCan(std::vector<Line>& lines, std::size_t headerDigits)
{
    std::map<std::string, std::size_t> lengths; // of the message of each module
    Masked masked;
    for (Line& line : lines) {
        Bytes const bytes = line.bytes(headerDigits);
        std::string const module = line.text(headerDigits);
        if (bytes.size() > 2 && bytes[0] >> 4 == 1 && holdsVin(bytes, 2)) {
            lengths[module] = (bytes[0] & 0x0FU) << 8 | bytes[1];
            ++masked.headings;
        }
        auto const length = lengths.find(module);
        if (length == lengths.end() || bytes.empty() || bytes[0] >> 4 != 2 || (bytes[0] & 0x0F) == 0) {
            continue;
        }
        std::size_t const first = 6 + 7 * ((bytes[0] & 0x0FU) - 1);
        for (std::size_t i = 1; i < bytes.size(); ++i) {
            std::size_t const place = first + i - 1;
            if (place + maskedCharacters >= length->second && place < length->second) {
                line.put(headerDigits, i, zero);
                ++masked.characters;
            }
        }
    }
    masked.modules = lengths.size();
    return masked;
}

// The legacy buses: five messages of four characters each, of which the first is filled with three zeros, and a check
// byte behind each.
Masked maskLegacy(std::vector<Line>& lines, bool j1850)
{
    constexpr std::size_t headerBytes = 3;
    constexpr std::size_t messages = 5;
    constexpr std::size_t charactersEach = 4;
    constexpr std::size_t filled = messages * charactersEach;
    std::set<std::string> modules;
    Masked masked;
    for (Line& line : lines) {
        Bytes bytes = line.bytes(0);
        std::size_t const data = headerBytes + 3;
        if (!holdsVin(bytes, headerBytes) || bytes.size() < data + charactersEach) {
            continue;
        }
        modules.insert(line.text(2 * headerBytes));
        ++masked.headings;
        std::size_t const first = (bytes[data - 1] - std::size_t{1}) * charactersEach;
        for (std::size_t i = 0; i < charactersEach; ++i) {
            if (first + i + maskedCharacters >= filled && first + i < filled) {
                line.put(0, data + i, zero);
                bytes[data + i] = zero;
                ++masked.characters;
            }
        }
        std::size_t const check = data + charactersEach;
        if (bytes.size() > check) {
            bytes.resize(check);
            line.put(0, check, j1850 ? obdsim::j1850Crc(bytes) : obdsim::sumChecksum(bytes));
        }
    }
    masked.modules = modules.size();
    return masked;
}

Masked mask(std::string& reply, obdsim::Protocol const& protocol)
{
    std::vector<Line> lines = linesOf(reply);
    switch (protocol.family) {
    case obdsim::BusFamily::Can11:
        return maskCan(lines, 3);
    case obdsim::BusFamily::Can29:
        return maskCan(lines, 8);
    case obdsim::BusFamily::J1850Pwm:
    case obdsim::BusFamily::J1850Vpw:
        return maskLegacy(lines, true);
    case obdsim::BusFamily::Iso9141:
    case obdsim::BusFamily::Kwp:
        return maskLegacy(lines, false);
    }
    return {};
}

std::size_t countHeadings(std::string const& reply)
{
    std::string const heading = "4902";
    std::string const text = obdsim::normaliseCommand(reply);
    std::size_t count = 0;
    for (std::size_t at = text.find(heading); at != std::string::npos; at = text.find(heading, at + heading.size())) {
        ++count;
    }
    return count;
}

void maskExchange(obdsim::Exchange& exchange, obdsim::Protocol const* protocol)
{
    std::string reply = exchange.received();
    std::size_t const headings = countHeadings(reply);
    if (headings == 0) {
        return;
    }
    Masked const masked = protocol != nullptr ? mask(reply, *protocol) : Masked();
    // A late reply stands with the next request, whose own digits may be 49 02 by chance.
    bool const asked = obdsim::normaliseCommand(exchange.sent).starts_with("0902");
    if (asked && !masked.complete(headings)) {
        exchange.chunks = {{exchange.chunks.front().pause, "NO DATA\r\r>"}};
        return;
    }
    std::size_t begin = 0;
    for (obdsim::DialogueChunk& chunk : exchange.chunks) {
        chunk.bytes = reply.substr(begin, chunk.bytes.size());
        begin += chunk.bytes.size();
    }
}

} // namespace

void maskVins(obdsim::Dialogue& dialogue)
{
    obdsim::Protocol const* const protocol = obdsim::findProtocol(dialogue.protocol);
    for (obdsim::Exchange& exchange : dialogue.exchanges) {
        maskExchange(exchange, protocol);
    }
}

} // namespace velmora
