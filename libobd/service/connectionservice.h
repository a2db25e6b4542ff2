#pragma once

#include "libobd/service/baseservice.h"

#include <obd/iconnectionservice.h>
#include <tervex/notifier.h>

namespace obd {

// Last in the order of the notifier, so that the application hears of a connection when everything else knows of it.
class ConnectionService : public IConnectionService,
                          public BaseService,
                          public tervex::Notifier<IConnectionServiceObserver>
{
public:
    explicit ConnectionService(IObdVelmora const* obd, Following following = Following::AtOnce);

    bool isConnected() const override { return BaseService::isConnected(); }
    std::string standardDescription() const override;
    IConnectionOptions* connectionOptions() const override;
    std::shared_ptr<IAdapter> adapter() const override;

private:
    void onServiceConnected() override;
    void onServiceDisconnected() override;
    void onEcuChanged() override;
};

} // namespace obd
