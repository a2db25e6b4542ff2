#pragma once

#include "libvelmora/poll/lentproxy.h"
#include "libvelmora/poll/pollplan.h"
#include "libvelmora/poll/pollresult.h"
#include "libvelmora/poll/ratemeter.h"
#include "libvelmora/poll/sensorstatistics.h"
#include "libvelmora/vehicle/units.h"

#include <obd/powertrainparameter.h>

#include <map>
#include <memory>
#include <optional>
#include <set>

namespace velmora {

// One parameter of one control module in the poller's hands: its decoder, the proxy lent to it, and the statistics of
// its sensors.
class PolledParameter
{
public:
    PolledParameter(PollWire& wire, std::shared_ptr<obd::IEcu> ecu, std::shared_ptr<obd::PowertrainParameter> parameter,
                    Units units);

    // Begins a turn. What is lent after it is used up by run.
    void begin() { m_proxy.begin(); }
    void lend(unsigned char pid, std::vector<unsigned char> const& payload);

    // Runs the decoder. Nothing where the module did not tell the parameter; for a derived value also while one of the
    // inputs that it has ever asked for is missing or older than 5 s, for the rest of its arithmetic would go on with
    // what it once had.
    std::optional<PollResult> run();
    // Whether the last run brought anything at all, were it only inputs.
    bool answered() const { return m_answered; }

    bool isDerived() const { return m_derived; }
    unsigned int module() const { return m_ecu->id(); }
    // The PIDs that the last run asked for.
    std::set<unsigned char> const& inputs() const { return m_proxy.asked(); }

private:
    bool inputsAreFresh(AnswerNotes::Time start) const;
    PollResult result();
    Reading reading(obd::SensorInfo const& info, bool alone) const;

    PollWire& m_wire;
    std::shared_ptr<obd::IEcu> m_ecu;
    std::shared_ptr<obd::PowertrainParameter> m_parameter;
    Units m_units;
    std::shared_ptr<LentProxy> m_lent;
    LentProxy& m_proxy;
    bool m_derived;
    bool m_answered = false;
    std::set<unsigned char> m_everAsked;
    std::vector<unsigned char> m_raw;
    std::map<int, SensorStatistics> m_statistics; // by uid
};

} // namespace velmora
