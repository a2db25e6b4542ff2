#pragma once

#include "libvelmora/http/httpserver.h"
#include "libvelmora/output/ioutput.h"
#include "libvelmora/output/metricspage.h"
#include "libvelmora/output/outputaddress.h"

#include <mutex>

namespace velmora {

// Serves /metrics on HOST:PORT.
class PrometheusOutput : public IOutput
{
public:
    PrometheusOutput(OutputAddress const& address, HealthSource health);

    void open() override;
    void write(Records records) override;
    void close() override { m_server.stop(); }

    // Where it listens, once it is open.
    unsigned short port() const { return m_server.port(); }

private:
    HttpPlace const m_place;
    HealthSource const m_health;
    std::mutex m_mutex;
    MetricsPage m_page; // protected by m_mutex
    HttpServer m_server;
};

} // namespace velmora
