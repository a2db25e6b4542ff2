#pragma once

#include "libobd/service/baseservice.h"

#include <obd/idataconnection.h>
#include <obd/itroubleshootingservice.h>
#include <tervex/notifier.h>

#include <atomic>

namespace obd {

// A tap on every data connection, through the connection manager, for as long as it lives.
class TroubleshootingService : public BaseService,
                               public ITroubleshootingService,
                               public IConnectionLogger,
                               public tervex::Notifier<ITroubleshootingServiceObserver>
{
public:
    explicit TroubleshootingService(IObdVelmora const* obd, Following following = Following::AtOnce);
    ~TroubleshootingService() override;

    std::string query(std::string const& request, int timeout) override;
    void startLogging() override { m_logging = true; }
    bool isLogging() override { return m_logging; }
    void stopLogging() override { m_logging = false; }
    Outcome<std::string> askQuery(std::string const& request, int timeout) override;

    void onDataSent(std::vector<unsigned char> const& data) override;
    void onDataReceived(std::vector<unsigned char> const& data) override;

protected:
    void startFollowing() override;
    void stopFollowing() override;

private:
    void tap();
    void untap();
    void addEntry(std::vector<unsigned char> const& data, int direction);

    bool m_tapping = false;             // the owner's thread alone
    std::atomic<bool> m_logging{false}; // read by whichever thread sends or receives
};

} // namespace obd
