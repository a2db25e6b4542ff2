#include "libvelmora/session/foundport.h"

#include "libvelmora/session/settingsstore.h"

#include <velmora/error.h>

namespace velmora {

namespace {

std::string foundPortKey()
{
    return "velmora/foundport";
}

// Nothing for what is no address: it would have to be written by hand, and all ports are looked at without it.
std::optional<PortAddress> rememberedPort(PortSearch const& search, std::filesystem::path const& settings)
{
    std::string last;
    if (!SettingsStore(settings).getString(foundPortKey(), last)) {
        return std::nullopt;
    }
    try {
        return parsePortAddress(last);
    } catch (Error const& error) {
        if (search.tell) {
            search.tell(std::string("The port remembered in ") + settings.string() + " is left out: " + error.what() +
                        "\n");
        }
        return std::nullopt;
    }
}

} // namespace

PortAddress findAdapterAgain(PortSearch search, std::filesystem::path const& settings)
{
    search.last = rememberedPort(search, settings);
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
