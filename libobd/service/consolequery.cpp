#include "libobd/service/consolequery.h"

#include <obd/iobdproxy.h>

#include <algorithm>

namespace obd {
namespace {

OutcomeKind judge(IDevice::Status status, AdapterNote note)
{
    if (status == IDevice::Status::Ok) {
        return OutcomeKind::Answered;
    }
    if (status != IDevice::Status::NoResponse) {
        return OutcomeKind::NotConnected; // Unparsed, too: of a text it only says that there is no link
    }
    switch (note) {
    case AdapterNote::NotUnderstood:
        return OutcomeKind::NotOffered;
    case AdapterNote::ReplyLost:
        return OutcomeKind::Unreadable;
    case AdapterNote::None:
        break;
    }
    return OutcomeKind::ModuleSilent;
}

} // namespace

ConsoleQuery::ConsoleQuery(std::string const& request, int timeout)
    : m_request(request), m_timeout(std::max(0, timeout))
{}

IQuery::UpdateStatus ConsoleQuery::update(std::shared_ptr<IObdProxy> const& proxy)
{
    AdapterNote note{};
    IDevice::Status const status = proxy->executeNoted(m_request, m_response, timeout(), note);
    m_verdict = {judge(status, note)};
    return status == IDevice::Status::Ok ? UpdateStatus::UpdateOk : UpdateStatus::UpdateFailed;
}

} // namespace obd
