#include "libvelmora/watch/requestcount.h"

namespace velmora {

namespace {

std::string_view viewOf(std::vector<unsigned char> const& data)
{
    return {reinterpret_cast<char const*>(data.data()), data.size()};
}

} // namespace

// Requests to the vehicle are hexadecimal digits; all else is for the adapter.
void RequestCount::onDataSent(std::vector<unsigned char> const& data)
{
    std::string_view const text = viewOf(data);
    bool const request =
        text.size() > 1 && text.find_first_not_of("0123456789ABCDEFabcdef \r") == std::string_view::npos;
    m_requests += request ? 1 : 0;
    if (m_tap) {
        m_tap(true, text);
    }
}

void RequestCount::onDataReceived(std::vector<unsigned char> const& data)
{
    if (m_tap) {
        m_tap(false, viewOf(data));
    }
    for (std::string_view const word : {"NO DATA", "ERROR", "UNABLE"}) {
        if (viewOf(data).find(word) != std::string_view::npos) {
            ++m_errors;
            return;
        }
    }
}

} // namespace velmora
