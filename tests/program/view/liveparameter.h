#pragma once

#include "libvelmora/live/livesensors.h"
#include "tests/support/fakeecu.h"

#include <obd/parameterdescriptor.h>
#include <obd/powertrainparameter.h>
#include <obd/sensordatamodels.h>
#include <obd/sensorinfo.h>
#include <obd/sensorvalue.h>

namespace support {

// A parameter with the sensors that a test gives it, by their names; one sensor bears the parameter's.
class LiveParameter : public obd::PowertrainParameter
{
public:
    LiveParameter(int pid, std::string title, std::vector<std::string> const& sensors, bool numeric,
                  MeasurementUnit unit)
        : PowertrainParameter(obd::ObdMode::CurrentData, 0), m_pid(pid), m_title(std::move(title))
    {
        int index = 0;
        for (std::string const& name : sensors) {
            auto const info = std::make_shared<obd::SensorInfo>(obd::Pid2Uid(pid) + index++, name, numeric);
            info->add(obd::UnitSystem::Metric, unit, 0.0, 100.0);
            m_infos.push_back(info);
        }
    }

    obd::ParameterIdentifier::Id pid() const override { return obd::ParameterIdentifier(m_pid).id(); }
    std::string description(obd::IEcu const& /*ecu*/) override { return m_title; }
    std::vector<std::shared_ptr<obd::SensorInfo const>> sensorInfo(obd::IEcu const& /*ecu*/) override
    {
        return m_infos;
    }
    std::vector<std::shared_ptr<obd::SensorValue>> values(obd::IEcu const& /*ecu*/, obd::UnitSystem /*system*/) override
    {
        return {};
    }
    void clear() override {}

protected:
    bool fromPayload(std::shared_ptr<obd::IEcu> const& /*ecu*/, std::vector<unsigned char> const& /*payload*/) override
    {
        return false;
    }

private:
    int m_pid;
    std::string m_title;
    std::vector<std::shared_ptr<obd::SensorInfo const>> m_infos;
};

inline velmora::LiveParameter liveParameter(int pid, std::string const& title,
                                            std::vector<std::string> const& sensors = {""}, bool numeric = true,
                                            MeasurementUnit unit = UnitPercent,
                                            velmora::Units units = velmora::Units::Metric)
{
    obd::ParameterDescriptor const descriptor(std::make_shared<LiveParameter>(pid, title, sensors, numeric, unit),
                                              std::make_shared<FakeEcu>(), obd::UnitSystem::Metric);
    return velmora::liveSensors(descriptor, descriptor, 0, std::nullopt, units);
}

inline std::shared_ptr<obd::SensorValueDataModel> liveValue(int uid, std::string const& text)
{
    return std::make_shared<obd::SensorValueDataModel>(uid, text, text, text, text);
}

} // namespace support
