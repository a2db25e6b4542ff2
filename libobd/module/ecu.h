#pragma once

#include <obd/iecu.h>

#include <map>
#include <memory>
#include <mutex>
#include <string>
#include <utility>
#include <vector>

namespace obd {

class IObdProxy;
class IQuery;
class OxygenSensorsPresent;
class PowertrainParameter;
class SupportedOids;
class TestEquipmentConfiguration;
class TestEquipmentConfiguration1;
class TestEquipmentConfiguration2;

// One control module. Made by the proxy and filled by init on the connection's thread; read from any thread.
class Ecu : public IEcu
{
public:
    Ecu(unsigned int id, ObdProtocol protocol, std::string protocolDescription, std::shared_ptr<IObdProxy> proxy);
    ~Ecu() override;
    Ecu(Ecu const&) = delete;
    Ecu& operator=(Ecu const&) = delete;

    // Asks the module what it can do. index is its place in the proxy's list, from 0. Only a module that tells nothing
    // of service 01 fails; a link lost on the way ends the run early.
    bool init(unsigned int index);

    unsigned int id() const override { return m_id; }
    bool detectFreezeFrameConfiguration(unsigned char frame) override;
    void resetFreezeFrameConfiguration() override;
    std::vector<unsigned char> supportedIds(ObdMode mode, unsigned char frame) const override;
    bool isSupported(OxygenSensorLocation location, unsigned char tid) const override;
    bool isSupported(ObdMode mode, unsigned char id, unsigned char frame) const override;
    std::vector<unsigned char> supportedTids(OxygenSensorLocation location) const override;
    ObdProtocol protocol() const override { return m_protocol; }
    std::string protocolDescription() const override { return m_protocolDescription; }
    ObdStandard standard() const override;
    std::string standardDescription() const override;
    std::string name() const override;
    std::string description() const override;
    OxygenSensorBank oxygenSensorBanks() const override;
    std::vector<OxygenSensorLocation> oxygenSensorLocations() const override;
    unsigned int equivalenceRatioMax() const override;
    unsigned int oxygenSensorVoltageMax() const override;
    unsigned int oxygenSensorCurrentMax() const override;
    unsigned int intakeManifoldAbsolutePressureMax() const override;
    double airFlowRateMax() const override;
    IgnitionType ignitionType() const override;
    Verdict detection(ObdMode mode, unsigned char frame) const override;

private:
    // A set begins with the identifier 0, which starts the chain of range requests. In the order of arrival.
    using OidSet = std::vector<unsigned char>;

    // A range request asks for so many identifiers; the last range begins there.
    static constexpr unsigned int rangeSize = 0x20;
    static constexpr unsigned int lastRange = 0xE0;

    // Null for a service without a set, or a freeze frame that was not detected. Called with m_mutex held.
    std::shared_ptr<OidSet> getOids(ObdMode mode, unsigned char frame) const;
    // The request for one range of a service; null for a service without ranges here.
    std::unique_ptr<SupportedOids> getOidParameter(ObdMode mode, unsigned char first, unsigned char frame) const;
    bool hasOid(ObdMode mode, unsigned char id, unsigned char frame) const;

    void addSupportedId(ObdMode mode, unsigned char id);
    void addSupportedOids(ObdMode mode, unsigned char frame, std::vector<unsigned char> const& ids);
    void addSupportedTid(OxygenSensorLocation location, unsigned char tid);
    void addSupportedTids(OxygenSensorLocation location, std::vector<unsigned char> const& tids);
    void logSupportedPids(ObdMode mode, unsigned char frame) const;

    bool detectConfiguration(ObdMode mode, unsigned char frame);
    // Of the replies to the ranges, the first that is missing counts.
    void setDetection(ObdMode mode, unsigned char frame, Verdict const& verdict);

    // The facts, in the order of init. False if the module was asked in vain, and of the standard also if it reports
    // none; the defaults stand then.
    bool detectTesterConfiguration1();
    bool detectTesterConfiguration2();
    bool detectIgnitionType();
    void addFuelConsumptionParameter();
    void addCustomParameters();
    bool detectStandard();
    bool detectOxygenSensors();
    bool updateEcuOxygenSensorLocations(OxygenSensorsPresent& query);
    void setFuelTrimByteUsage();
    bool areAllPresentFor1D() const;
    bool detectMode05Configuration();
    bool detectTestIdentifiers(OxygenSensorLocation location);
    void detectEcuName(unsigned int index);

    void detectModuleFacts(); // the first five
    bool isReported(PowertrainParameter const& parameter) const;
    bool succeeds(IQuery& query) const;
    bool detectTesterConfiguration(TestEquipmentConfiguration& configuration, int number);
    // found gets what the module reports, so that the chain of ranges can go on.
    bool detectFirstTestIdentifiers(OxygenSensorLocation location, std::vector<unsigned char>& found);

    // Constant after construction.
    unsigned int const m_id;
    ObdProtocol const m_protocol;
    std::string const m_protocolDescription;
    std::shared_ptr<IObdProxy> const m_proxy;
    std::unique_ptr<TestEquipmentConfiguration1> const m_testerConfiguration1; // guards its values itself
    std::unique_ptr<TestEquipmentConfiguration2> const m_testerConfiguration2; // guards its values itself

    // Protected by m_mutex, which is never held over a request.
    mutable std::mutex m_mutex;
    std::shared_ptr<OidSet> m_mode01Oids;
    std::map<unsigned char, std::shared_ptr<OidSet>> m_mode02Oids; // by freeze frame
    std::map<OxygenSensorLocation, std::shared_ptr<OidSet>> m_mode05Tids;
    std::map<std::pair<ObdMode, unsigned char>, Verdict> m_detections; // by service and freeze frame
    std::shared_ptr<OidSet> m_mode06Oids;
    std::shared_ptr<OidSet> m_mode08Oids;
    std::shared_ptr<OidSet> m_mode09Oids;
    ObdStandard m_standard = 0;
    std::string m_standardDescription;
    std::string m_name;
    std::string m_description;
    std::vector<OxygenSensorLocation> m_oxygenSensorLocations;
    IgnitionType m_ignitionType = IgnitionType::Spark;
};

} // namespace obd
