#include "libvelmora/dash/dashplace.h"

#include "libvelmora/http/httpguard.h"

#include <velmora/error.h>

#include <algorithm>
#include <arpa/inet.h>
#include <ifaddrs.h>
#include <memory>
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

std::string addressAmong(ifaddrs const* list)
{
    for (ifaddrs const* each = list; each != nullptr; each = each->ifa_next) {
        bool const usable = each->ifa_addr != nullptr && each->ifa_addr->sa_family == AF_INET &&
                            (each->ifa_flags & (IFF_LOOPBACK | IFF_UP)) == IFF_UP;
        if (usable) {
            char text[INET_ADDRSTRLEN] = {};
            ::inet_ntop(AF_INET, &reinterpret_cast<sockaddr_in const*>(each->ifa_addr)->sin_addr, text, sizeof(text));
            return text;
        }
    }
    return "127.0.0.1";
}

std::string ownAddress()
{
    ifaddrs* all = nullptr;
    if (::getifaddrs(&all) != 0) {
        return addressAmong(nullptr);
    }
    std::unique_ptr<ifaddrs, decltype(&::freeifaddrs)> const freed(all, ::freeifaddrs);
    return addressAmong(all);
}

std::string pageLink(std::string const& place, unsigned short port, std::string const& token)
{
    std::string const host = place == "0.0.0.0" || place == "::" ? ownAddress() : place;
    bool const six = host.find(':') != std::string::npos;
    return "http://" + (six ? "[" + host + "]" : host) + ":" + std::to_string(port) + "/" +
           (token.empty() ? "" : "#t=" + token);
}

} // namespace velmora
