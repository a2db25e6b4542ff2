#include "libvelmora/uds/udscodes.h"

#include <fmt/format.h>

#include <algorithm>
#include <iterator>

namespace velmora {

namespace {

constexpr unsigned char formatJ2012 = 0x00;
constexpr unsigned char formatJ2012Wwh = 0x04;

constexpr unsigned char failedBit = 0x01;
constexpr unsigned char pendingBit = 0x04;
constexpr unsigned char confirmedBit = 0x08;
constexpr unsigned char lampBit = 0x80;

} // namespace

TopicAnswer topicAnswer(ModuleAnswer const& answer)
{
    switch (answer.kind) {
    case ModuleAnswer::Kind::Positive:
        return TopicAnswer::Read;
    case ModuleAnswer::Kind::Refused:
        return TopicAnswer::Refused;
    case ModuleAnswer::Kind::Unreadable:
    case ModuleAnswer::Kind::Foreign:
        return TopicAnswer::Unreadable;
    default:
        return TopicAnswer::Silent;
    }
}

std::string UdsCode::code() const
{
    constexpr char letters[] = {'P', 'C', 'B', 'U'};
    return fmt::format("{}{:X}{:X}{:02X}", letters[bytes[0] >> 6U], bytes[0] >> 4U & 0x03U, bytes[0] & 0x0FU, bytes[1]);
}

std::string UdsCode::hex() const
{
    return fmt::format("{:02X}{:02X}{:02X}", bytes[0], bytes[1], bytes[2]);
}

bool isStandardFormat(UdsCodeReport const& report)
{
    return report.format == formatJ2012 || report.format == formatJ2012Wwh;
}

UdsCodeReport readUdsCodes(ModuleAsker& asker, RequestAddress const& address)
{
    UdsCodeReport report;
    ModuleAnswer const counted = asker.ask(address, {0x19, 0x01, mattersMask}, RequestPurpose::Codes);
    if (counted.kind == ModuleAnswer::Kind::Positive && counted.payload.size() == 6) {
        report.format = counted.payload[3];
        report.count = static_cast<unsigned int>(counted.payload[4]) << 8U | counted.payload[5];
    }
    ModuleAnswer const listed = asker.ask(address, {0x19, 0x02, mattersMask}, RequestPurpose::Codes);
    report.answer = topicAnswer(listed);
    report.reason = describe(listed);
    if (listed.kind == ModuleAnswer::Kind::Refused) {
        report.refusal = listed.code;
    }
    if (listed.kind != ModuleAnswer::Kind::Positive) {
        return report;
    }
    constexpr std::size_t lead = 3; // 59 02 and the available status
    if (listed.payload.size() < lead || (listed.payload.size() - lead) % 4 != 0) {
        report.answer = TopicAnswer::Unreadable;
        report.reason = "is answered unreadably";
        return report;
    }
    report.available = listed.payload[2];
    for (std::size_t i = lead; i < listed.payload.size(); i += 4) {
        UdsCode code;
        std::copy_n(listed.payload.begin() + static_cast<std::ptrdiff_t>(i), std::size(code.bytes), code.bytes);
        code.status = listed.payload[i + 3];
        report.codes.push_back(code);
    }
    return report;
}

std::vector<std::string> statusWords(unsigned char status, unsigned char available)
{
    unsigned int const told = status & available;
    std::vector<std::string> words;
    bool const present = (told & failedBit) != 0;
    bool const confirmed = (told & confirmedBit) != 0;
    if (present) {
        words.emplace_back("present");
    }
    if (confirmed) {
        words.emplace_back("confirmed");
    } else if ((told & pendingBit) != 0) {
        words.emplace_back("pending");
    }
    // A module that does not know the bit says nothing of now.
    if (confirmed && !present && (available & failedBit) != 0) {
        words.emplace_back("stored");
    }
    if ((told & lampBit) != 0) {
        words.emplace_back("lamp");
    }
    return words;
}

} // namespace velmora
