#pragma once

#include "libobd/service/baseservice.h"

#include <obd/itroublecodeservice.h>

namespace obd {

class PowertrainParameter;
class SensorDescriptor;
class SensorValue;

// Holds no state of its own: each operation asks with a parameter object that it makes.
class TroubleCodeService : public BaseService, public ITroubleCodeService
{
public:
    explicit TroubleCodeService(IObdVelmora const* obd, Following following = Following::AtOnce);

    std::vector<std::shared_ptr<DtcDataModel>> fetchConfirmedCodes() override;
    std::vector<std::shared_ptr<DtcDataModel>> fetchPendingCodes() override;
    std::vector<std::shared_ptr<DtcDataModel>> fetchPermanentCodes() override;
    std::shared_ptr<MilStatus> fetchMilStatus() override;
    std::shared_ptr<SensorDataModel> fetchDistance(bool sinceMil) override;
    std::shared_ptr<SensorDataModel> fetchRuntime(bool sinceMil) override;
    std::shared_ptr<DtcDataModel> fetchFreezeFrameTroubleCode(unsigned char frame) override;
    std::vector<ParameterIdentifier::Id> fetchFreezeFramePids(unsigned char frame) override;
    std::vector<std::shared_ptr<SensorDataModel>> fetchFreezeFrameSensors(unsigned char frame,
                                                                          ParameterIdentifier::Id id) override;
    std::shared_ptr<ParameterDataModel> fetchFreezeFrameParameter(unsigned char frame,
                                                                  ParameterIdentifier::Id id) override;
    bool resetCodes() const override;

private:
    template <typename Codes>
    std::vector<std::shared_ptr<DtcDataModel>> fetchCodes() const;
    std::shared_ptr<SensorDataModel> fetchRequest(std::shared_ptr<PowertrainParameter> const& parameter) const;
    static std::shared_ptr<SensorDescriptor> getFirstSensor(std::shared_ptr<PowertrainParameter> const& parameter,
                                                            std::shared_ptr<IEcu> const& ecu, UnitSystem system);
    static std::shared_ptr<SensorValue> getFirstSensorValue(std::shared_ptr<PowertrainParameter> const& parameter,
                                                            std::shared_ptr<IEcu> const& ecu, UnitSystem system);
};

} // namespace obd
