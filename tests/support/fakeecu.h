#pragma once

#include <obd/iecu.h>

#include <memory>

namespace support {

// A control module as data; set the fields that a test needs.
class FakeEcu : public obd::IEcu
{
public:
    explicit FakeEcu(unsigned int id = 0x7E8, obd::ObdProtocol protocol = obd::ObdProtocolCan11)
        : m_id(id), m_protocol(protocol)
    {}

    unsigned int id() const override { return m_id; }
    bool detectFreezeFrameConfiguration(unsigned char /*frame*/) override { return false; }
    void resetFreezeFrameConfiguration() override {}
    std::vector<unsigned char> supportedIds(obd::ObdMode /*mode*/, unsigned char /*frame*/) const override
    {
        return {};
    }
    bool isSupported(obd::OxygenSensorLocation /*location*/, unsigned char /*tid*/) const override { return false; }
    bool isSupported(obd::ObdMode /*mode*/, unsigned char /*id*/, unsigned char /*frame*/) const override
    {
        return false;
    }
    std::vector<unsigned char> supportedTids(obd::OxygenSensorLocation /*location*/) const override { return {}; }
    obd::ObdProtocol protocol() const override { return m_protocol; }
    std::string protocolDescription() const override { return {}; }
    obd::ObdStandard standard() const override { return 0; }
    std::string standardDescription() const override { return {}; }
    std::string name() const override { return {}; }
    std::string description() const override { return {}; }
    obd::OxygenSensorBank oxygenSensorBanks() const override { return obd::OxygenSensorBank::None; }
    std::vector<obd::OxygenSensorLocation> oxygenSensorLocations() const override { return {}; }
    unsigned int equivalenceRatioMax() const override { return 0; }
    unsigned int oxygenSensorVoltageMax() const override { return 0; }
    unsigned int oxygenSensorCurrentMax() const override { return 0; }
    unsigned int intakeManifoldAbsolutePressureMax() const override { return 0; }
    double airFlowRateMax() const override { return 0.0; }
    obd::IgnitionType ignitionType() const override { return obd::IgnitionType::Spark; }

private:
    unsigned int m_id;
    obd::ObdProtocol m_protocol;
};

} // namespace support
