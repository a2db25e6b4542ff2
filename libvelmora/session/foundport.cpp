#include "libvelmora/session/foundport.h"

#include "libvelmora/session/settingsstore.h"

#include <velmora/error.h>

namespace velmora {

namespace {

std::string foundPortKey()
{
    return "velmora/foundport";
}

} // namespace

PortAddress findAdapterAgain(PortSearch search, std::filesystem::path const& settings)
{
    if (std::string last; SettingsStore(settings).getString(foundPortKey(), last)) {
        search.last = parsePortAddress(last);
    }
    PortAddress found = findAdapter(search);
    if (found != search.last) {
        try {
            // With a store of its own: what was chosen for this run stays out of the file.
            SettingsStore kept(settings);
            kept.setString(foundPortKey(), toAddressText(found));
            kept.sync();
        } catch (Error const& error) {
            if (search.tell) {
                search.tell(std::string("The port is not remembered: ") + error.what() + "\n");
            }
        }
    }
    return found;
}

} // namespace velmora
