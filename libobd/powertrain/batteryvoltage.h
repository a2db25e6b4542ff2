#pragma once

#include "libobd/powertrain/derivedparameter.h"

#include <atomic>

namespace obd {

// The supply voltage as the adapter measures it. No control module has a part in it: every one reads the same.
class BatteryVoltage : public DerivedParameter
{
public:
    BatteryVoltage();

    // Fails, keeping the old value, if the adapter tells none.
    UpdateStatus update(std::shared_ptr<IObdProxy> const& proxy) override;
    void clear() override;
    Verdict verdict(IEcu const& ecu) const override; // the same for every module

    double voltage() const; // V; 0.0 while unknown

private:
    double value(IEcu const& ecu, UnitSystem system) const override;

    std::atomic<double> m_voltage{0.0};
    std::atomic<OutcomeKind> m_outcome{OutcomeKind::ModuleSilent};
};

} // namespace obd
