#include "libvelmora/uds/kwpcodes.h"

#include "libvelmora/signal/signalhex.h"
#include "libvelmora/uds/moduleaddress.h"

#include <algorithm>

namespace velmora {

namespace {

constexpr std::size_t kwpLead = 2; // 58 and how many
constexpr std::size_t kwpCodeBytes = 3;
// Modules know one of two ways to ask for the stored codes of all groups.
constexpr unsigned char kwpWays[] = {0x00, 0x02};

} // namespace

std::string KwpCode::hex() const
{
    return hexText({bytes[0], bytes[1]});
}

KwpCodeReport readKwpCodes(ModuleAsker& asker, RequestAddress const& address)
{
    KwpCodeReport report;
    for (unsigned char const way : kwpWays) {
        ModuleAnswer const answer = asker.ask(address, {0x18, way, 0xFF, 0x00}, RequestPurpose::Codes);
        report.answer = topicAnswer(answer);
        report.reason = describe(answer);
        if (answer.kind == ModuleAnswer::Kind::Positive) {
            std::size_t const size = answer.payload.size();
            bool const whole = size >= kwpLead && size == kwpLead + answer.payload[1] * kwpCodeBytes;
            if (!whole) {
                report.answer = TopicAnswer::Unreadable;
                report.reason = "is answered unreadably";
                return report;
            }
            for (auto each = answer.payload.begin() + kwpLead; each != answer.payload.end(); each += kwpCodeBytes) {
                report.codes.push_back({{each[0], each[1]}, each[2]});
            }
            return report;
        }
        if (answer.kind != ModuleAnswer::Kind::Refused || answer.code == 0x11) {
            return report;
        }
    }
    return report;
}

std::optional<unsigned int> CodesByService::count() const
{
    if (answer() != TopicAnswer::Read) {
        return std::nullopt;
    }
    return static_cast<unsigned int>(kwp ? kwp->codes.size() : uds.codes.size());
}

// 12 is what modules of ISO 14230-3 say to a format that they do not know.
bool isServiceMissing(unsigned char code)
{
    return code == 0x10 || code == 0x11 || code == 0x12 || code == 0x7F;
}

CodesByService readModuleCodes(ModuleAsker& asker, RequestAddress const& address)
{
    CodesByService codes;
    if (isLegacyHeader(address.header)) {
        codes.kwp = readKwpCodes(asker, address);
        return codes;
    }
    codes.uds = readUdsCodes(asker, address);
    if (codes.uds.refusal && isServiceMissing(*codes.uds.refusal)) {
        KwpCodeReport kwp = readKwpCodes(asker, address);
        if (kwp.answer == TopicAnswer::Read || kwp.answer == TopicAnswer::Unreadable) {
            codes.kwp = std::move(kwp);
        }
    }
    return codes;
}

} // namespace velmora
