#include "libvelmora/dash/dashplace.h"

#include "libvelmora/http/httpguard.h"

#include <velmora/error.h>

#include <algorithm>
#include <arpa/inet.h>
#include <ifaddrs.h>
#include <net/if.h>

namespace velmora {

bool isAllowed(OutputAddress const& address, std::string const& key)
{
    std::string const value = address.option(key, "no");
    if (value != "yes" && value != "no") {
        throw Error(ErrorKind::WrongUse, key + ": \"" + value + "\" is neither yes nor no");
    }
    return value == "yes";
}

std::set<std::string> hostNamesOf(std::string_view list)
{
    std::set<std::string> names;
    while (!list.empty()) {
        std::string_view const part = list.substr(0, list.find(','));
        list.remove_prefix(std::min(part.size() + 1, list.size()));
        std::optional<std::string> const name = hostNameIn(part);
        if (!name || part.find(':') != std::string_view::npos) {
            throw Error(ErrorKind::WrongUse, "\"" + std::string(part) + "\" is no name of a host");
        }
        names.insert(*name);
    }
    return names;
}

std::string ownAddress()
{
    std::string result = "127.0.0.1";
    ifaddrs* all = nullptr;
    if (::getifaddrs(&all) != 0) {
        return result;
    }
    for (ifaddrs const* each = all; each != nullptr; each = each->ifa_next) {
        bool const usable = each->ifa_addr != nullptr && each->ifa_addr->sa_family == AF_INET &&
                            (each->ifa_flags & IFF_LOOPBACK) == 0 && (each->ifa_flags & IFF_UP) != 0;
        if (usable) {
            char text[INET_ADDRSTRLEN] = {};
            ::inet_ntop(AF_INET, &reinterpret_cast<sockaddr_in const*>(each->ifa_addr)->sin_addr, text, sizeof(text));
            result = text;
            break;
        }
    }
    ::freeifaddrs(all);
    return result;
}

std::string dumpedJson(Json const& value)
{
    return value.dump(-1, ' ', false, Json::error_handler_t::replace);
}

} // namespace velmora
