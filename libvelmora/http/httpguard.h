#pragma once

#include "libvelmora/http/httpmessage.h"

#include <optional>
#include <set>
#include <string_view>

// Who may ask a page's server: what browsers tell truthfully of the page that a request comes from.

namespace velmora {

// The name in a Host field, without its port and without brackets; nothing for a text that is none.
std::optional<std::string> hostNameIn(std::string_view field);

// Whether the text is an IPv4 or IPv6 address. Such a name can't be made to lead elsewhere.
bool isAddress(std::string const& name);

// Whether the address is this machine's own: 127.0.0.0/8, ::1, and localhost.
bool isLoopback(std::string const& name);

// The value of a cookie, nothing for one that was not sent.
std::optional<std::string> cookieIn(HttpRequest const& request, std::string_view name);

// Takes as long for a text that is nearly the same as for any other of its length.
bool sameSecret(std::string_view given, std::string_view secret);

// 128 random bits as 22 characters of base64url. Throws Error.
std::string makeToken();

// Refuses a request with no or more than one Host (400), one whose host is neither an address, nor localhost, nor one
// of the names (421), and one that a page of another origin makes (403); a request that changes something has to name
// its origin.
std::optional<HttpResponse> refuseForeign(HttpRequest const& request, std::set<std::string> const& names);

} // namespace velmora
