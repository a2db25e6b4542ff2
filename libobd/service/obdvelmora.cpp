#include "libobd/service/obdvelmora.h"

#include "libobd/connection/configuration.h"
#include "libobd/connection/connectionmanager.h"
#include "libobd/connection/connectionnotifier.h"
#include "libobd/connection/ecumanager.h"
#include "libobd/connection/velmorasettings.h"
#include "libobd/service/velmorainstance.h"

#include <common/logrecord.h>
#include <obd/obdvelmorabuilder.h>

namespace obd {

ObdVelmora::ObdVelmora(unsigned int hostValue1, unsigned int hostValue2, unsigned int hostValue3,
                       std::shared_ptr<ISettings> const& settings)
    : m_hostValue1(hostValue1), m_hostValue2(hostValue2), m_hostValue3(hostValue3),
      m_settings(std::make_unique<VelmoraSettings>(settings)),
      m_connectionNotifier(std::make_unique<ConnectionNotifier>()),
      m_connectionManager(std::make_shared<ConnectionManager>())
{
    m_connectionManager->addPhaseListener(m_connectionNotifier.get());
    m_ecuManager =
        std::make_unique<EcuManager>(*m_connectionNotifier, m_connectionManager->getProxy().get(), m_settings.get());
    VelmoraInstance::set(this);
}

ObdVelmora::~ObdVelmora()
{
    m_ecuManager.reset();
    m_connectionManager->removePhaseListener(m_connectionNotifier.get());
    m_connectionManager->closeConnection();
    m_connectionManager.reset();
    m_connectionNotifier.reset();
    m_settings.reset();
}

std::shared_ptr<IConnectionManager> ObdVelmora::getConnectionManager() const
{
    return m_connectionManager;
}

IEcuManager* ObdVelmora::getEcuManager() const
{
    return m_ecuManager.get();
}

IVelmoraSettings* ObdVelmora::getSettings() const
{
    return m_settings.get();
}

IConfiguration* ObdVelmora::getConfiguration() const
{
    // Without state of its own, so one serves all.
    static Configuration configuration;
    return &configuration;
}

IConnectionNotifier* ObdVelmora::getConnectionNotifier() const
{
    return m_connectionNotifier.get();
}

std::shared_ptr<IObdVelmora> ObdVelmoraBuilder::createObdVelmora(unsigned int hostValue1, unsigned int hostValue2,
                                                                 unsigned int hostValue3,
                                                                 std::shared_ptr<ISettings> const& settings)
{
    if (settings == nullptr) {
        TERVEX_LOG(Fatal) << "No settings to build a top-level object on";
        return nullptr;
    }
    return std::make_shared<ObdVelmora>(hostValue1, hostValue2, hostValue3, settings);
}

} // namespace obd
