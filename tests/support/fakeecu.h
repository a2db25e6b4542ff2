#pragma once

#include <obd/iecu.h>

#include <algorithm>
#include <map>
#include <string>
#include <utility>
#include <vector>

namespace support {

// A control module that is what a test says. Setters return the module itself, so that one line can describe it:
//     auto const ecu = std::make_shared<FakeEcu>();
//     ecu->setProtocol(obd::ObdProtocolIso9141).setSupported(obd::ObdMode::CurrentData, {0x0C, 0x0D});
// Unlike a real module it does not support the identifier 0 unasked. Not guarded: set it up before threads read it.
class FakeEcu : public obd::IEcu
{
public:
    explicit FakeEcu(unsigned int id = 0x7E8, obd::ObdProtocol protocol = obd::ObdProtocolCan11)
        : m_id(id), m_protocol(protocol)
    {}

    FakeEcu& setProtocol(obd::ObdProtocol protocol) { return set(m_protocol, protocol); }
    FakeEcu& setProtocolDescription(std::string const& text) { return set(m_protocolDescription, text); }
    FakeEcu& setStandard(obd::ObdStandard standard) { return set(m_standard, standard); }
    FakeEcu& setStandardDescription(std::string const& text) { return set(m_standardDescription, text); }
    FakeEcu& setName(std::string const& text) { return set(m_name, text); }
    FakeEcu& setDescription(std::string const& text) { return set(m_description, text); }
    FakeEcu& setIgnitionType(obd::IgnitionType type) { return set(m_ignitionType, type); }

    FakeEcu& setOxygenSensorBanks(obd::OxygenSensorBank banks) { return set(m_banks, banks); }
    FakeEcu& setOxygenSensorLocations(std::vector<obd::OxygenSensorLocation> const& locations)
    {
        return set(m_locations, locations);
    }

    FakeEcu& setEquivalenceRatioMax(unsigned int maximum) { return set(m_equivalenceRatioMax, maximum); }
    FakeEcu& setOxygenSensorVoltageMax(unsigned int maximum) { return set(m_oxygenSensorVoltageMax, maximum); }
    FakeEcu& setOxygenSensorCurrentMax(unsigned int maximum) { return set(m_oxygenSensorCurrentMax, maximum); }
    FakeEcu& setManifoldPressureMax(unsigned int maximum) { return set(m_manifoldPressureMax, maximum); }
    FakeEcu& setAirFlowRateMax(double maximum) { return set(m_airFlowRateMax, maximum); }

    // What the module supports in a service other than 02 and 05.
    FakeEcu& setSupported(obd::ObdMode mode, std::vector<unsigned char> const& ids)
    {
        return set(m_supported[mode], ids);
    }
    // What a freeze frame holds, once it is detected. Detecting a frame of which nothing was said fails.
    FakeEcu& setFrame(unsigned char frame, std::vector<unsigned char> const& ids) { return set(m_frames[frame], ids); }
    // The service 05 tests of a sensor.
    FakeEcu& setTests(obd::OxygenSensorLocation location, std::vector<unsigned char> const& tids)
    {
        return set(m_tests[location], tids);
    }

    // How asking for a service's set went, of all freeze frames alike; answered unless told otherwise.
    FakeEcu& setDetection(obd::ObdMode mode, obd::Verdict const& verdict) { return set(m_detections[mode], verdict); }

    // How often the bus would have been asked for a frame.
    int frameDetections() const { return m_frameDetections; }

    unsigned int id() const override { return m_id; }

    bool detectFreezeFrameConfiguration(unsigned char frame) override
    {
        if (!m_detected.contains(frame)) {
            ++m_frameDetections;
            if (m_frames.contains(frame)) {
                m_detected[frame] = m_frames[frame];
            }
        }
        return m_detected.contains(frame);
    }
    void resetFreezeFrameConfiguration() override { m_detected.clear(); }

    std::vector<unsigned char> supportedIds(obd::ObdMode mode, unsigned char frame) const override
    {
        return mode == obd::ObdMode::FreezeFrame ? find(m_detected, frame) : find(m_supported, mode);
    }
    std::vector<unsigned char> supportedTids(obd::OxygenSensorLocation location) const override
    {
        return find(m_tests, location);
    }
    bool isSupported(obd::OxygenSensorLocation location, unsigned char tid) const override
    {
        return has(supportedTids(location), tid);
    }
    bool isSupported(obd::ObdMode mode, unsigned char id, unsigned char frame) const override
    {
        return has(supportedIds(mode, frame), id);
    }

    obd::ObdProtocol protocol() const override { return m_protocol; }
    std::string protocolDescription() const override { return m_protocolDescription; }
    obd::ObdStandard standard() const override { return m_standard; }
    std::string standardDescription() const override { return m_standardDescription; }
    std::string name() const override { return m_name; }
    std::string description() const override { return m_description; }
    obd::OxygenSensorBank oxygenSensorBanks() const override { return m_banks; }
    std::vector<obd::OxygenSensorLocation> oxygenSensorLocations() const override { return m_locations; }
    unsigned int equivalenceRatioMax() const override { return m_equivalenceRatioMax; }
    unsigned int oxygenSensorVoltageMax() const override { return m_oxygenSensorVoltageMax; }
    unsigned int oxygenSensorCurrentMax() const override { return m_oxygenSensorCurrentMax; }
    unsigned int intakeManifoldAbsolutePressureMax() const override { return m_manifoldPressureMax; }
    double airFlowRateMax() const override { return m_airFlowRateMax; }
    obd::IgnitionType ignitionType() const override { return m_ignitionType; }
    obd::Verdict detection(obd::ObdMode mode, unsigned char /*frame*/) const override
    {
        auto const found = m_detections.find(mode);
        return found != m_detections.end() ? found->second : obd::Verdict{};
    }

private:
    using Ids = std::vector<unsigned char>;

    template <typename T>
    FakeEcu& set(T& field, T const& value)
    {
        field = value;
        return *this;
    }

    template <typename Key>
    static Ids find(std::map<Key, Ids> const& sets, Key key)
    {
        auto const found = sets.find(key);
        return found == sets.end() ? Ids{} : found->second;
    }

    static bool has(Ids const& ids, unsigned char id) { return std::find(ids.begin(), ids.end(), id) != ids.end(); }

    unsigned int m_id;
    obd::ObdProtocol m_protocol;
    std::string m_protocolDescription{"ISO 15765-4 (CAN 11/500)"};
    obd::ObdStandard m_standard{0};
    std::string m_standardDescription;
    std::string m_name{"ECM"};
    std::string m_description{"Engine Control"};
    obd::IgnitionType m_ignitionType{obd::IgnitionType::Spark};
    obd::OxygenSensorBank m_banks{obd::OxygenSensorBank::Pid13};
    std::vector<obd::OxygenSensorLocation> m_locations;
    unsigned int m_equivalenceRatioMax{2};
    unsigned int m_oxygenSensorVoltageMax{8};
    unsigned int m_oxygenSensorCurrentMax{128};
    unsigned int m_manifoldPressureMax{255};
    double m_airFlowRateMax{655.35};
    std::map<obd::ObdMode, Ids> m_supported;
    std::map<unsigned char, Ids> m_frames;
    std::map<unsigned char, Ids> m_detected;
    std::map<obd::OxygenSensorLocation, Ids> m_tests;
    std::map<obd::ObdMode, obd::Verdict> m_detections;
    int m_frameDetections{0};
};

} // namespace support
