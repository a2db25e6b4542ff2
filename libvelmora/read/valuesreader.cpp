#include "libvelmora/read/valuesreader.h"

#include "libvelmora/report/unitlabel.h"

#include <obd/ivelmorasettings.h>
#include <obd/parameterfactory.h>
#include <obd/powertrainparameter.h>
#include <obd/sensorinfo.h>
#include <obd/sensorvalue.h>

#include <algorithm>
#include <iterator>
#include <span>
#include <utility>

namespace velmora {

namespace {

constexpr unsigned char wantedPids[] = {0x03, 0x05, 0x06, 0x07, 0x08, 0x09, 0x0C, 0x0F,
                                        0x1F, 0x21, 0x30, 0x31, 0x42, 0x46, 0x4D, 0x4E};
constexpr unsigned char movingPids[] = {0x03, 0x05, 0x06, 0x07, 0x08, 0x09, 0x0C, 0x42};

// One reading of one PID, whose values and sensor descriptions belong to it.
class ValueReading
{
public:
    ValueReading(Session& session, obd::IEcu const& ecu, std::shared_ptr<obd::IObdProxy> const& bus, unsigned char pid)
        : m_ecu(ecu), m_units(session.obd().getSettings()->unitSystem()),
          m_parameter(obd::ParameterFactory().createParameter(ecu, *session.obd().getSettings(),
                                                              obd::ParameterIdentifier(pid).id()))
    {
        if (m_parameter != nullptr) {
            // An update is well where any module answered; the values of one that did not would be fallbacks.
            m_told = m_parameter->update(bus) == obd::IQuery::UpdateStatus::UpdateOk && m_parameter->delivered(ecu);
            session.check();
        }
    }

    std::vector<LiveValue> values(unsigned char pid)
    {
        std::vector<LiveValue> list;
        if (!m_told) {
            return list;
        }
        auto const infos = m_parameter->sensorInfo(m_ecu);
        auto const metric = m_parameter->values(m_ecu, obd::UnitSystem::Metric);
        for (auto const& shown : m_parameter->values(m_ecu, m_units)) {
            auto const info =
                std::find_if(infos.begin(), infos.end(), [&](auto const& each) { return each->uid() == shown->uid(); });
            if (info == infos.end()) {
                continue;
            }
            LiveValue value{pid,
                            static_cast<int>(info - infos.begin()),
                            m_parameter->description(m_ecu),
                            shown->textualValue(),
                            unitLabel(shown->uid(), (*info)->unit(m_units)),
                            {}};
            if (infos.size() > 1) {
                value.name += ": " + (*info)->description();
            }
            if (auto const number = numberOf(metric, shown->uid())) {
                value.samples.push_back(*number);
            }
            list.push_back(std::move(value));
        }
        return list;
    }

private:
    static std::optional<double> numberOf(std::vector<std::shared_ptr<obd::SensorValue>> const& values, int uid)
    {
        auto const found =
            std::find_if(values.begin(), values.end(), [uid](auto const& each) { return each->uid() == uid; });
        return found != values.end() ? (*found)->number() : std::nullopt;
    }

    obd::IEcu const& m_ecu;
    obd::UnitSystem m_units;
    std::shared_ptr<obd::PowertrainParameter> m_parameter;
    bool m_told = false;
};

std::vector<LiveValue> readPids(Session& session, obd::IEcu const& ecu, std::shared_ptr<GroupedPids> const& bus,
                                std::vector<unsigned char> const& pids)
{
    session.select(ecu);
    std::vector<LiveValue> list;
    for (unsigned char const pid : pids) {
        std::vector<LiveValue> const values = ValueReading(session, ecu, bus, pid).values(pid);
        list.insert(list.end(), values.begin(), values.end());
    }
    return list;
}

std::vector<unsigned char> supported(obd::IEcu const& ecu, std::span<unsigned char const> pids)
{
    std::vector<unsigned char> list;
    std::copy_if(pids.begin(), pids.end(), std::back_inserter(list),
                 [&ecu](unsigned char pid) { return ecu.isSupported(obd::ObdMode::CurrentData, pid, 0); });
    return list;
}

// First those that are asked for again later, so that one request stands for both times.
std::vector<unsigned char> movingFirst(std::vector<unsigned char> pids)
{
    std::stable_partition(pids.begin(), pids.end(), [](unsigned char pid) {
        return std::find(std::begin(movingPids), std::end(movingPids), pid) != std::end(movingPids);
    });
    return pids;
}

} // namespace

std::vector<LiveValue> readValues(Session& session, obd::IEcu const& ecu, std::shared_ptr<GroupedPids> const& bus)
{
    std::vector<unsigned char> const pids = supported(ecu, wantedPids);
    bus->fetch(movingFirst(pids));
    session.check();
    return readPids(session, ecu, bus, pids);
}

void readValuesAgain(Session& session, obd::IEcu const& ecu, std::shared_ptr<GroupedPids> const& bus,
                     std::vector<LiveValue>& values)
{
    std::vector<unsigned char> const pids = supported(ecu, movingPids);
    bus->fetch(pids);
    session.check();
    for (LiveValue& later : readPids(session, ecu, bus, pids)) {
        auto const known = std::find_if(values.begin(), values.end(), [&later](LiveValue const& each) {
            return each.pid == later.pid && each.part == later.part;
        });
        if (known == values.end()) {
            values.push_back(std::move(later));
        } else {
            known->value = later.value;
            known->samples.insert(known->samples.end(), later.samples.begin(), later.samples.end());
        }
    }
}

} // namespace velmora
