#include "libobd/service/consolequery.h"

#include <obd/iobdproxy.h>

#include <algorithm>

namespace obd {

ConsoleQuery::ConsoleQuery(std::string const& request, int timeout)
    : m_request(request), m_timeout(std::max(0, timeout))
{}

IQuery::UpdateStatus ConsoleQuery::update(std::shared_ptr<IObdProxy> const& proxy)
{
    bool const answered = proxy->execute(m_request, m_response, timeout()) == IDevice::Status::Ok;
    return answered ? UpdateStatus::UpdateOk : UpdateStatus::UpdateFailed;
}

} // namespace obd
