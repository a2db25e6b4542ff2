#include "libvelmora/output/prometheusoutput.h"

namespace velmora {

PrometheusOutput::PrometheusOutput(OutputAddress const& address, HealthSource health)
    : m_place(parseHttpPlace(address.target)), m_health(std::move(health))
{
    m_server.addRoute("GET", "/metrics", [this](HttpRequest const& /*request*/) {
        Health const now = m_health();
        std::lock_guard const lock(m_mutex);
        HttpResponse response;
        response.contentType = "text/plain; version=0.0.4; charset=utf-8";
        response.body = m_page.render(std::chrono::steady_clock::now(), now);
        return response;
    });
}

void PrometheusOutput::open()
{
    m_server.start(m_place);
}

void PrometheusOutput::write(Records records)
{
    std::lock_guard const lock(m_mutex);
    for (SharedRecord const& record : records) {
        if (auto const* const reading = std::get_if<Reading>(record.get())) {
            m_page.take(*reading, std::chrono::steady_clock::now());
        }
    }
}

} // namespace velmora
