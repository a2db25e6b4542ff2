#pragma once

#include "libvelmora/http/httpguard.h"

#include <atomic>
#include <set>

namespace velmora {

// Who may see the page's data. The shell of the page tells nothing and is open; a browser that has the link brings the
// token of its fragment to login, and has a cookie from then on.
class DashAccess
{
public:
    // An empty token lets everyone in that refuseForeign lets in.
    DashAccess(std::string token, std::set<std::string> names) : m_token(std::move(token)), m_names(std::move(names)) {}

    // The port names the cookie: cookies of one host are sent to all of its ports.
    void setPort(unsigned short port) { m_port = port; }

    std::optional<HttpResponse> gate(HttpRequest const& request) const;
    HttpResponse login(HttpRequest const& request);

    std::string const& token() const { return m_token; }

private:
    std::string cookieName() const { return "velmora_" + std::to_string(m_port); }

    std::string const m_token;
    std::set<std::string> const m_names;
    std::atomic<unsigned short> m_port{0};
    unsigned int m_wrong = 0; // tries; the server's thread
};

} // namespace velmora
