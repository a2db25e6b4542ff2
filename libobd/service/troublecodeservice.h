#pragma once

#include "libobd/service/ask.h"

#include <obd/itroublecodeservice.h>

namespace obd {

class PowertrainParameter;
class SensorDescriptor;
class SensorValue;

// Holds no state of its own: each operation asks with a parameter object that it makes.
class TroubleCodeService : public BaseService, public ITroubleCodeService
{
public:
    using Dtcs = std::vector<std::shared_ptr<DtcDataModel>>;

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

    Outcome<Dtcs> askConfirmedCodes() override;
    Outcome<Dtcs> askPendingCodes() override;
    Outcome<Dtcs> askPermanentCodes() override;
    Outcome<std::shared_ptr<MilStatus>> askMilStatus() override;
    Outcome<std::shared_ptr<SensorDataModel>> askDistance(bool sinceMil) override;
    Outcome<std::shared_ptr<SensorDataModel>> askRuntime(bool sinceMil) override;
    Outcome<std::shared_ptr<DtcDataModel>> askFreezeFrameTroubleCode(unsigned char frame) override;
    Outcome<std::vector<ParameterIdentifier::Id>> askFreezeFramePids(unsigned char frame) override;
    Outcome<std::vector<std::shared_ptr<SensorDataModel>>> askFreezeFrameSensors(unsigned char frame,
                                                                                 ParameterIdentifier::Id id) override;
    Outcome<std::shared_ptr<ParameterDataModel>> askFreezeFrameParameter(unsigned char frame,
                                                                         ParameterIdentifier::Id id) override;
    Outcome<bool> askResetCodes() const override;

private:
    // The fetch operations ask whatever the module says it supports, the others do not: they say what it needs.
    using Need = std::optional<Needed>;

    template <typename Codes>
    Outcome<Dtcs> askCodes() const;
    Outcome<std::shared_ptr<MilStatus>> askMil(Need const& needed) const;
    Outcome<std::shared_ptr<SensorDataModel>> askRequest(std::shared_ptr<PowertrainParameter> const& parameter) const;
    Outcome<std::vector<std::shared_ptr<SensorDataModel>>> askSensors(unsigned char frame, ParameterIdentifier::Id id,
                                                                      Need const& needed) const;
    Outcome<std::shared_ptr<ParameterDataModel>> askParameter(unsigned char frame, ParameterIdentifier::Id id,
                                                              Need const& needed) const;
    // make turns what was read of the parameter into the value.
    template <typename Make>
    auto askFrame(std::shared_ptr<PowertrainParameter> const& parameter, Need const& needed, Make const& make) const;
    // Of an identifier that no freeze frame holds.
    Verdict withoutParameter() const;
    static std::shared_ptr<SensorDescriptor> getFirstSensor(std::shared_ptr<PowertrainParameter> const& parameter,
                                                            std::shared_ptr<IEcu> const& ecu, UnitSystem system);
    static std::shared_ptr<SensorValue> getFirstSensorValue(std::shared_ptr<PowertrainParameter> const& parameter,
                                                            std::shared_ptr<IEcu> const& ecu, UnitSystem system);
};

} // namespace obd
