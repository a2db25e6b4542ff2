#include "libvelmora/dash/dashaccess.h"

namespace velmora {

namespace {

constexpr unsigned int freeTries = 10;
constexpr std::chrono::seconds slowTry{1};

bool isOpenToAll(std::string const& path)
{
    return path == "/" || path == "/login" || path == "/notices.txt" || path.starts_with("/page/");
}

} // namespace

std::optional<HttpResponse> DashAccess::gate(HttpRequest const& request) const
{
    if (auto refused = refuseForeign(request, m_names)) {
        return refused;
    }
    if (m_token.empty() || isOpenToAll(request.path) ||
        sameSecret(cookieIn(request, cookieName()).value_or(""), m_token)) {
        return std::nullopt;
    }
    return plainResponse(401, "Open the page by the link with the token that the program told");
}

HttpResponse DashAccess::login(HttpRequest const& request)
{
    if (!m_token.empty() && !sameSecret(request.body, m_token)) {
        HttpResponse refused = plainResponse(401, "This is not the token");
        if (++m_wrong > freeTries) {
            refused.delay = slowTry;
        }
        return refused;
    }
    HttpResponse response;
    response.status = 204;
    if (!m_token.empty()) {
        response.headers.emplace_back("Set-Cookie",
                                      cookieName() + "=" + m_token + "; Path=/; HttpOnly; SameSite=Strict");
    }
    return response;
}

} // namespace velmora
