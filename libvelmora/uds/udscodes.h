#pragma once

#include "libvelmora/uds/moduleasker.h"

#include <velmora/troublecode.h>

#include <optional>
#include <string>
#include <vector>

namespace velmora {

// One trouble code of service 19 (ISO 14229-1).
struct UdsCode
{
    unsigned char bytes[3] = {}; // two of the code, and the failure type
    unsigned char status = 0;

    std::string code() const; // "P0299", of the first two
    unsigned char failureType() const { return bytes[2]; }
    std::string hex() const; // "029900"
};

// What a module tells of its trouble codes by service 19.
struct UdsCodeReport
{
    TopicAnswer answer = TopicAnswer::Silent;
    std::string reason;                     // why not, in words
    std::optional<unsigned char> refusal;   // the code, where it was refused
    std::optional<unsigned char> format;    // of the codes; nothing if the module does not tell it
    std::optional<unsigned int> count;      // as it counts them itself
    std::optional<unsigned char> available; // the status bits that it knows
    std::vector<UdsCode> codes;
};

// Of the status: failed now, pending, confirmed, or with the warning lamp on.
inline constexpr unsigned char mattersMask = 0x8D;

// The codes that matter: failed now, pending, confirmed, or with the lamp on (mask 8D). Asks for their number first, by
// which the module tells how it writes them.
UdsCodeReport readUdsCodes(ModuleAsker& asker, RequestAddress const& address);

// What an answer is to a reader of codes.
TopicAnswer topicAnswer(ModuleAnswer const& answer);

// Whether the first two bytes are a code of SAE J2012, with a failure type.
bool isStandardFormat(UdsCodeReport const& report);

// "present", "pending", "confirmed", "stored", "lamp": what the status says, by the bits that the module knows.
std::vector<std::string> statusWords(unsigned char status, unsigned char available);

} // namespace velmora
