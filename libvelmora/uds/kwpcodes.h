#pragma once

#include "libvelmora/uds/udscodes.h"

#include <optional>
#include <string>
#include <vector>

namespace velmora {

// A trouble code of service 18 (ISO 14230-3). The reply does not tell whether its number is one of SAE J2012 or the
// maker's own, and the status byte is laid out as the maker likes: both are shown as they are.
struct KwpCode
{
    unsigned char bytes[2] = {};
    unsigned char status = 0;

    std::string hex() const; // "0299"
};

// What a module tells of its trouble codes by service 18.
struct KwpCodeReport
{
    TopicAnswer answer = TopicAnswer::Silent;
    std::string reason; // why not, in words
    std::vector<KwpCode> codes;
};

KwpCodeReport readKwpCodes(ModuleAsker& asker, RequestAddress const& address);

// The codes of a module, by the services that it knows.
struct CodesByService
{
    UdsCodeReport uds;
    std::optional<KwpCodeReport> kwp; // of one that does not know service 19, or is on a legacy bus

    TopicAnswer answer() const { return kwp ? kwp->answer : uds.answer; }
    // Nothing if it did not tell them.
    std::optional<unsigned int> count() const;
};

// Service 19, and where a module has none of it, service 18.
CodesByService readModuleCodes(ModuleAsker& asker, RequestAddress const& address);

// Whether a refusal says that the module does not know the whole service.
bool isServiceMissing(unsigned char code);

} // namespace velmora
