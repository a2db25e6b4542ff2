#pragma once

#include <obd/dtcdatamodel.h>
#include <obd/powertrainparameter.h>
#include <obd/sensorinfo.h>

#include <map>

namespace obd {

// PID 0x02 of service 02: the trouble code that caused a freeze frame to be stored.
class FreezeFrameTroubleCode : public PowertrainParameter
{
public:
    explicit FreezeFrameTroubleCode(unsigned char frame);

    void clear() override;
    ParameterIdentifier::Id pid() const override;
    std::string description(IEcu const& ecu) override;
    std::vector<std::shared_ptr<SensorInfo const>> sensorInfo(IEcu const& ecu) override;
    std::vector<std::shared_ptr<SensorValue>> values(IEcu const& ecu, UnitSystem system) override;

    // The code with its generic meaning; null if the module has no such frame or did not answer.
    std::shared_ptr<DtcDataModel> getTroubleCode(IEcu const& ecu) const;

protected:
    bool fromPayload(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& payload) override;

private:
    std::map<unsigned int, std::shared_ptr<DtcDataModel>> m_codes; // by module id
    std::shared_ptr<SensorInfo const> m_info;
};

} // namespace obd
