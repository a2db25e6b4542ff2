#pragma once

#include <obd/iquery.h>

#include <string>

namespace obd {

// A text command to the adapter as a query, so that it takes its turn among the others.
class ConsoleQuery : public IQuery
{
public:
    // timeout in milliseconds; a negative one counts as none, lest it be taken for weeks.
    ConsoleQuery(std::string const& request, int timeout);

    UpdateStatus update(std::shared_ptr<IObdProxy> const& proxy) override;
    unsigned int timeout() const override { return static_cast<unsigned int>(m_timeout); }
    void clear() override { m_response.clear(); }
    Verdict verdict(IEcu const& /*ecu*/) const override { return m_verdict; }

    // How the last update went; ModuleSilent before one.
    Verdict verdict() const { return m_verdict; }

    // What the adapter said; empty before an update.
    std::string response() const { return m_response; }

private:
    std::string m_request;
    int m_timeout;
    std::string m_response;
    Verdict m_verdict{OutcomeKind::ModuleSilent};
};

} // namespace obd
