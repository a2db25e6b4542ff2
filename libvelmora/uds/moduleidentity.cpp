#include "libvelmora/uds/moduleidentity.h"

#include "libvelmora/uds/identification.h"
#include "libvelmora/uds/kwpcodes.h"
#include "libvelmora/uds/moduleaddress.h"

#include <utility>

namespace velmora {

namespace {

constexpr unsigned char byIdentifier22 = 0x22;
constexpr unsigned char byLocalIdentifier1A = 0x1A;
constexpr unsigned char serviceNotSupported = 0x11;
// Of ISO 14230-3, as far as modules of several makers answer them: all in one, the VIN, and a part number.
constexpr unsigned char localIdentifiers[] = {0x80, 0x90, 0x9B};

} // namespace

ModuleIdentity::ModuleIdentity(ModuleAsker& asker, std::function<void()> check)
    : m_asker(asker), m_check(std::move(check))
{}

ModuleAnswer ModuleIdentity::ask(RequestAddress const& address, std::vector<unsigned char> const& request)
{
    m_check();
    return m_asker.ask(address, request);
}

std::string ModuleIdentity::text(RequestAddress const& address, unsigned int did)
{
    std::vector<unsigned char> const request{byIdentifier22, static_cast<unsigned char>(did >> 8U),
                                             static_cast<unsigned char>(did & 0xFFU)};
    ModuleAnswer const answer = ask(address, request);
    m_serviceMissing = answer.kind == ModuleAnswer::Kind::Refused && isServiceMissing(answer.code);
    if (answer.kind != ModuleAnswer::Kind::Positive || answer.payload.size() <= request.size()) {
        return {};
    }
    return identifierText(did, {answer.payload.begin() + 3, answer.payload.end()});
}

void ModuleIdentity::readByService1A(FoundModule& module, RequestAddress const& address)
{
    for (unsigned char const id : localIdentifiers) {
        ModuleAnswer const answer = ask(address, {byLocalIdentifier1A, id});
        if (answer.kind == ModuleAnswer::Kind::Refused && answer.code == serviceNotSupported) {
            return; // any other refusal may be of this identifier alone
        }
        if (answer.kind == ModuleAnswer::Kind::Positive && answer.payload.size() > 2) {
            module.identifiers[static_cast<unsigned int>(byLocalIdentifier1A) << 8U | id] =
                localIdentifierText({answer.payload.begin() + 2, answer.payload.end()});
        }
    }
}

// On legacy buses nobody speaks ISO 14229.
bool ModuleIdentity::asksByService22(RequestAddress const& address) const
{
    return !isLegacyHeader(address.header);
}

void ModuleIdentity::identify(FoundModule& module)
{
    AddressOrReason const reached = addressOf(module.request, module.reply, {}, m_asker.proxy().protocol());
    if (!reached.address) {
        return;
    }
    RequestAddress const& address = *reached.address;
    m_serviceMissing = !asksByService22(address);
    if (!m_serviceMissing) {
        module.name = text(address, 0xF197);
    }
    if (!m_serviceMissing) {
        module.part = text(address, 0xF187);
        module.software = text(address, 0xF189);
        module.software = module.software.empty() ? text(address, 0xF195) : module.software;
    } else {
        readByService1A(module, address);
    }
    m_check();
    module.codes = readModuleCodes(m_asker, address).count();
}

void ModuleIdentity::readIdentifiers(FoundModule& module)
{
    AddressOrReason const reached = addressOf(module.request, module.reply, {}, m_asker.proxy().protocol());
    if (!reached.address) {
        return;
    }
    m_serviceMissing = !asksByService22(*reached.address);
    for (IdentifierRow const& row : standardIdentifiers()) {
        if (m_serviceMissing) {
            return readByService1A(module, *reached.address);
        }
        if (std::string const told = text(*reached.address, row.did); !told.empty()) {
            module.identifiers[row.did] = told;
        }
    }
}

} // namespace velmora
