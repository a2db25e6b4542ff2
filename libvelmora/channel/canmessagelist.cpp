#include "libvelmora/channel/canmessagelist.h"

#include <algorithm>

namespace velmora {

namespace {

constexpr unsigned int sequenceNumbers = 16;

} // namespace

bool ModuleMessages::add(BusLine const& line, std::string const& digits, std::size_t place)
{
    if (line.kind == BusLine::Kind::Consecutive) {
        return addConsecutive(line, digits, place);
    }
    ModuleMessage message{.module = line.module,
                          .length = line.payload.size(),
                          .carried = m_carried,
                          .payload = line.payload,
                          .lines = {digits},
                          .places = {place},
                          .headerDigits = line.header.size()};
    if (line.kind == BusLine::Kind::First) {
        ModuleMessage const* const before = open(line.module);
        if (before != nullptr && before->lines.size() == 1 && before->lines.front() == digits) {
            note(Habit::RepeatedFrame);
            return false;
        }
        message.length = (line.bytes[0] & 0x0FU) << 8U | line.bytes[1];
    } else if (isCanBus(m_bus) && line.bytes.size() > line.payload.size() + 1) {
        note(Habit::Padding);
        message.lines = {line.header + frameDigits({line.bytes[0]}) + frameDigits(line.payload)};
    }
    m_messages.push_back(std::move(message));
    return true;
}

ModuleMessage* ModuleMessages::open(unsigned int module)
{
    auto const found = std::find_if(m_messages.rbegin(), m_messages.rend(),
                                    [module](ModuleMessage const& message) { return message.module == module; });
    return found != m_messages.rend() && found->segmented() ? &*found : nullptr;
}

bool ModuleMessages::addConsecutive(BusLine const& line, std::string const& digits, std::size_t place)
{
    ModuleMessage* const message = open(line.module);
    if (message == nullptr) {
        ++m_orphans[line.module];
        note(Habit::OrphanFrame);
        return false;
    }
    if (message->lines.back() == digits) {
        note(Habit::RepeatedFrame);
        return false;
    }
    if (message->payload.size() >= message->length) {
        note(Habit::OrphanFrame);
        return false;
    }
    // A number that this message does not reach is of another one.
    std::size_t const told = line.bytes[0] & 0x0FU;
    std::size_t const frames = message->length / m_carried;
    if (frames < sequenceNumbers && (told == 0 || told > frames)) {
        ++m_orphans[line.module];
        note(Habit::OrphanFrame);
        return false;
    }
    std::size_t const number = message->lines.size();
    if (told != number % sequenceNumbers) {
        message->inOrder = false;
    }
    std::size_t const missing = message->length - (m_carried - 1) - m_carried * (number - 1);
    std::size_t const needed = std::min(missing, m_carried);
    if (line.payload.size() < needed) {
        note(Habit::BrokenLine);
        return false;
    }
    std::string text = digits;
    if (line.bytes.size() < m_carried + 1) {
        note(Habit::ShortLastFrame);
        text += std::string(2 * (m_carried + 1 - line.bytes.size()), '0');
    }
    message->payload.insert(message->payload.end(), line.payload.begin(),
                            line.payload.begin() + static_cast<std::ptrdiff_t>(needed));
    std::size_t const numberAt = line.header.size() + (m_carried < 7 ? 2 : 0); // of the frame's number
    bool const twice = std::any_of(message->lines.begin() + 1, message->lines.end(), [&](std::string const& other) {
        return number < sequenceNumbers && other.substr(numberAt, 2) == text.substr(numberAt, 2);
    });
    message->broken = message->broken || twice;
    message->lines.push_back(text);
    message->places.push_back(place);
    return true;
}

std::vector<std::string> plainFrames(std::string const& header, std::vector<std::uint8_t> const& payload)
{
    constexpr std::size_t singleBytes = 7;
    constexpr std::size_t firstBytes = 6;
    auto const length = static_cast<unsigned int>(payload.size());
    if (length <= singleBytes) {
        return {header + frameDigits({static_cast<std::uint8_t>(length)}) + frameDigits(payload)};
    }
    auto const part = [&payload](std::size_t begin, std::size_t count) {
        std::vector<std::uint8_t> bytes(count, 0);
        std::size_t const end = std::min(begin + count, payload.size());
        std::copy(payload.begin() + static_cast<std::ptrdiff_t>(begin),
                  payload.begin() + static_cast<std::ptrdiff_t>(end), bytes.begin());
        return frameDigits(bytes);
    };
    std::vector<std::string> frames{
        header + frameDigits({static_cast<std::uint8_t>(0x10U | length >> 8U), static_cast<std::uint8_t>(length)}) +
        part(0, firstBytes)};
    for (std::size_t at = firstBytes; at < payload.size(); at += singleBytes) {
        auto const number = static_cast<std::uint8_t>(0x20U | frames.size() % sequenceNumbers);
        frames.push_back(header + frameDigits({number}) + part(at, singleBytes));
    }
    return frames;
}

} // namespace velmora
