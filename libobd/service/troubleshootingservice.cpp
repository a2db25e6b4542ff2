#include "libobd/service/troubleshootingservice.h"

#include "libobd/dispatch/fetcher.h"
#include "libobd/message/messageentry.h"
#include "libobd/service/ask.h"
#include "libobd/service/builtservice.h"
#include "libobd/service/consolequery.h"

#include <common/logrecord.h>
#include <obd/iconnectionmanager.h>
#include <obd/iobdvelmora.h>

#include <utility>

namespace obd {

namespace {

// Null, with a log line, if there is none.
std::shared_ptr<IConnectionManager> findManager(IObdVelmora const& obd)
{
    std::shared_ptr<IConnectionManager> manager = obd.getConnectionManager();
    if (manager == nullptr) {
        TERVEX_LOG(Fatal) << "No IConnectionManager";
    }
    return manager;
}

} // namespace

TroubleshootingService::TroubleshootingService(IObdVelmora const* obd, Following following)
    : BaseService(obd, servicePriority, following)
{
    if (following == Following::AtOnce) {
        tap();
    }
}

TroubleshootingService::~TroubleshootingService()
{
    untap();
}

void TroubleshootingService::startFollowing()
{
    BaseService::startFollowing();
    tap();
}

void TroubleshootingService::stopFollowing()
{
    untap();
    BaseService::stopFollowing();
}

void TroubleshootingService::tap()
{
    m_tapping = true;
    if (auto const manager = findManager(*obd())) {
        manager->addLogger(this);
    }
}

void TroubleshootingService::untap()
{
    if (!std::exchange(m_tapping, false)) {
        return;
    }
    if (auto const manager = findManager(*obd())) {
        manager->removeLogger(this);
    }
}

Outcome<std::string> TroubleshootingService::askQuery(std::string const& request, int timeout)
{
    auto const console = std::make_shared<ConsoleQuery>(request, timeout);
    FetchEnd const end = runFetch(console);
    if (end == FetchEnd::Succeeded) {
        return {Verdict{}, console->response()};
    }
    TERVEX_LOG(Error) << "Failed to query request: " << request;
    switch (end) {
    case FetchEnd::Dropped:
        return Verdict{OutcomeKind::NotConnected};
    case FetchEnd::Failed:
        return judged(*this, console->verdict());
    default:
        return judged(*this, {OutcomeKind::ModuleSilent}); // late: the query is not to be touched
    }
}

std::string TroubleshootingService::query(std::string const& request, int timeout)
{
    return askQuery(request, timeout).value;
}

void TroubleshootingService::onDataSent(std::vector<unsigned char> const& data)
{
    addEntry(data, MessageDataModel::Sent);
}

void TroubleshootingService::onDataReceived(std::vector<unsigned char> const& data)
{
    addEntry(data, MessageDataModel::Received);
}

void TroubleshootingService::addEntry(std::vector<unsigned char> const& data, int direction)
{
    if (!m_logging) {
        return;
    }
    notify(&ITroubleshootingServiceObserver::onLogEntryAdded, makeMessageEntry(data, direction));
}

std::shared_ptr<ITroubleshootingService> TroubleshootingServiceBuilder::createTroubleshootingService()
{
    return buildService<TroubleshootingService>();
}

} // namespace obd
