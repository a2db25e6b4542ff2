#pragma once

#include "libobd/powertrain/samplelist.h"
#include "libobd/powertrain/tableparameter.h"

#include <obd/powertrainparameter.h>

#include <functional>
#include <map>

namespace obd {

struct DerivedRange
{
    MeasurementUnit unit;
    double minimum;
    double maximum;
};

// All about a sensor that no module reports.
struct DerivedRow
{
    ParameterIdentifier::Id id;
    char const* title;
    int decimals;
    DerivedRange metric;
    DerivedRange imperial;
};

// A parameter with one sensor, worked out from others. Its update runs those through the proxy, one after the other, so
// it may take several times its timeout(). It has no request of its own, and no reply reaches it.
class DerivedParameter : public PowertrainParameter
{
public:
    // row must outlive the parameter.
    explicit DerivedParameter(DerivedRow const& row);

    ParameterIdentifier::Id pid() const override;
    std::string description(IEcu const& ecu) override;
    std::vector<std::shared_ptr<SensorInfo const>> sensorInfo(IEcu const& ecu) override;
    std::vector<std::shared_ptr<SensorValue>> values(IEcu const& ecu, UnitSystem system) override;
    // Answered for the modules whose own inputs came in the last update. What is worked out may still rest on an older
    // reading of a module for which it is not.
    Verdict verdict(IEcu const& ecu) const override;

protected:
    using Ecus = std::vector<std::shared_ptr<IEcu>>;
    using Feed = std::function<void(IEcu const& ecu, Sample const& sample)>;

    // Those of the modules for which valid holds.
    static Ecus choose(Ecus const& ecus, std::function<bool(IEcu const&)> const& valid);

    // Runs an input. If it succeeds, feed gets the reading of each of the modules that has one, all with the same time,
    // in the metric unit.
    static bool poll(TableParameter& input, std::shared_ptr<IObdProxy> const& proxy, Ecus const& ecus,
                     Feed const& feed);

    using Inputs = std::vector<PowertrainParameter const*>;

    // At the end of an update: what each of the modules delivered of the inputs that it needs, which inputsOf tells.
    // The first that did not come counts.
    void judge(Ecus const& ecus, std::function<Inputs(IEcu const&)> const& inputsOf);
    void judge(Ecus const& ecus, Inputs const& inputs);

    static UpdateStatus status(bool success) { return success ? UpdateStatus::UpdateOk : UpdateStatus::UpdateFailed; }

    void getRequestData(std::vector<unsigned char>& data) const override;
    void getSignature(std::vector<unsigned char>& signature) const override;
    bool fromBytes(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& data) override;
    bool fromPayload(std::shared_ptr<IEcu> const& ecu, std::vector<unsigned char> const& payload) override;

private:
    virtual double value(IEcu const& ecu, UnitSystem system) const = 0;

    DerivedRow const& m_row;
    std::shared_ptr<SensorInfo const> m_info;
    std::map<unsigned int, Verdict> m_verdicts; // by module id
};

// Whether the module reports all of these PIDs.
template <typename Pids>
bool supportsAll(IEcu const& ecu, Pids const& pids)
{
    for (unsigned char const pid : pids) {
        if (!ecu.isSupported(ObdMode::CurrentData, pid, 0)) {
            return false;
        }
    }
    return true;
}

} // namespace obd
