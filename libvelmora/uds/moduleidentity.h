#pragma once

#include "libvelmora/uds/foundmodule.h"
#include "libvelmora/uds/moduleasker.h"

#include <functional>
#include <optional>
#include <string>

namespace velmora {

// Asks control modules who they are: by service 22 (ISO 14229-1), and those that do not know it by service 1A
// (ISO 14230-3).
class ModuleIdentity
{
public:
    // check is called between requests and throws to end the work. The asker must outlive it.
    ModuleIdentity(ModuleAsker& asker, std::function<void()> check);

    // Name, part number and software version, and how many trouble codes there are.
    void identify(FoundModule& module);
    // All that the standards have identifiers for.
    void readIdentifiers(FoundModule& module);

private:
    ModuleAnswer ask(RequestAddress const& address, std::vector<unsigned char> const& request);
    std::string text(RequestAddress const& address, unsigned int did);
    void readByService1A(FoundModule& module, RequestAddress const& address);
    bool asksByService22(RequestAddress const& address) const;

    ModuleAsker& m_asker;
    std::function<void()> const m_check;
    bool m_serviceMissing = false; // the last module asked does not know service 22
};

} // namespace velmora
