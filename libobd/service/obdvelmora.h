#pragma once

#include <obd/iobdvelmora.h>

#include <memory>

namespace obd {

class Configuration;
class ConnectionManager;
class ConnectionNotifier;
class EcuManager;
class ISettings;
class VelmoraSettings;

class ObdVelmora : public IObdVelmora
{
public:
    // Makes itself the current VelmoraInstance as its last step.
    ObdVelmora(unsigned int hostValue1, unsigned int hostValue2, unsigned int hostValue3,
               std::shared_ptr<ISettings> const& settings);
    // Closes the connection. The services are told nothing any more: they must be gone.
    ~ObdVelmora() override;
    ObdVelmora(ObdVelmora const&) = delete;
    ObdVelmora& operator=(ObdVelmora const&) = delete;

    unsigned int getHostValue1() const override { return m_hostValue1; }
    unsigned int getHostValue2() const override { return m_hostValue2; }
    unsigned int getHostValue3() const override { return m_hostValue3; }
    std::shared_ptr<IConnectionManager> getConnectionManager() const override;
    IEcuManager* getEcuManager() const override;
    IVelmoraSettings* getSettings() const override;
    IConfiguration* getConfiguration() const override;
    IConnectionNotifier* getConnectionNotifier() const override;

private:
    unsigned int const m_hostValue1;
    unsigned int const m_hostValue2;
    unsigned int const m_hostValue3;
    // In the order of their making.
    std::unique_ptr<VelmoraSettings> m_settings;
    std::unique_ptr<ConnectionNotifier> m_connectionNotifier;
    std::shared_ptr<ConnectionManager> m_connectionManager;
    std::unique_ptr<EcuManager> m_ecuManager;
};

} // namespace obd
