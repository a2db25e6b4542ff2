#pragma once

#include <obd/export.h>
#include <obd/messagedatamodel.h>
#include <obd/outcome.h>
#include <tervex/inotifier.h>

#include <memory>
#include <string>

namespace obd {

/// Hears of the traffic with the adapter while logging is on.
class ITroubleshootingServiceObserver
{
public:
    virtual ~ITroubleshootingServiceObserver() = default;

    /// Unlike all other observers, this one is called on the thread that sends or receives, mostly the dispatcher's
    /// worker, in the middle of an exchange. Post what is wanted to a thread of your own and return; don't call
    /// anything that blocks or that asks the vehicle.
    virtual void onLogEntryAdded(std::shared_ptr<MessageDataModel> const& /*entry*/) {}
};

/// The raw view on the adapter: a console and a log of the traffic. Attach observers while logging is off. An entry may
/// still be under way on another thread when stopLogging returns, so detach without a connection only, or let go of the
/// service, whose end waits for it.
class ITroubleshootingService : public virtual tervex::INotifier<ITroubleshootingServiceObserver>
{
public:
    /// Sends a command word for word and gives what the adapter says, line ends removed. Waits up to timeout
    /// milliseconds and 50 more, the time in the dispatcher's queue included; a negative one counts as none. Empty,
    /// with a log line, without a connection or an answer. Blocks; call from any thread but the dispatcher's worker. A
    /// command that changes the adapter's settings may break the connection.
    virtual std::string query(std::string const& request, int timeout) = 0;

    /// Logging is off at the start, and stays as it is across connections. Any thread.
    virtual void startLogging() = 0;
    virtual bool isLogging() = 0;   ///< whether observers are told
    virtual void stopLogging() = 0; ///< any thread

    /// query, with how it went. Answered is any text, a control module's refusal among them: it is given as it came, so
    /// there is no Refused, and an adapter stores nothing that it could have none of, so there is no NothingStored.
    /// NotOffered is the adapter's "?": it does not know the command. ModuleSilent: nothing in time, or the adapter's
    /// words for silence, such as "NO DATA". Unreadable: its words for a reply that was damaged or cut off.
    virtual Outcome<std::string> askQuery(std::string const& request, int timeout) = 0;
};

namespace TroubleshootingServiceBuilder {

/// A new service on the top-level object that was built last, which must outlive it; null before the first one. Build
/// and drop it on the thread that dispatches: see IObdVelmora.
OBD_EXPORT std::shared_ptr<ITroubleshootingService> createTroubleshootingService();

} // namespace TroubleshootingServiceBuilder

} // namespace obd
