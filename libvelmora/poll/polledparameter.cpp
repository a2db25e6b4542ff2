#include "libvelmora/poll/polledparameter.h"

#include "libvelmora/read/oxygencurrent.h"
#include "libvelmora/read/sensornames.h"
#include "libvelmora/report/unitlabel.h"

#include <obd/sensorinfo.h>

#include <fmt/format.h>

#include <algorithm>
#include <utility>

namespace velmora {

namespace {

// A value that is worked out asks for some inputs only each 5 s itself; the tenth of a second is for its own pace.
constexpr std::chrono::milliseconds oldestInput{5100};

int decimalsOf(obd::NumericSensorValue const& value)
{
    std::string const text = value.toString(0.0);
    std::size_t const point = text.find('.');
    return point == std::string::npos ? 0 : static_cast<int>(text.size() - point - 1);
}

bool hasNoRequest(obd::PowertrainParameter const& parameter)
{
    std::vector<unsigned char> request;
    parameter.requestData(request);
    return request.empty();
}

} // namespace

PolledParameter::PolledParameter(PollWire& wire, std::shared_ptr<obd::IEcu> ecu,
                                 std::shared_ptr<obd::PowertrainParameter> parameter, Units units)
    : m_wire(wire), m_ecu(std::move(ecu)), m_parameter(std::move(parameter)), m_units(units),
      m_lent(std::make_shared<LentProxy>(wire, m_ecu)), m_proxy(*m_lent), m_derived(hasNoRequest(*m_parameter))
{
    m_parameter->clear(); // what a value keeps may be of another drive
}

void PolledParameter::lend(unsigned char pid, std::vector<unsigned char> const& payload)
{
    m_raw = payload;
    m_proxy.lend(pid, payload);
}

bool PolledParameter::inputsAreFresh(AnswerNotes::Time start) const
{
    return m_wire.notes().areFresh(m_ecu->id(), m_everAsked, start, oldestInput);
}

std::optional<PollResult> PolledParameter::run()
{
    AnswerNotes::Time const start = m_wire.now();
    if (!m_parameter->keepsHistory()) {
        m_parameter->clear();
    }
    m_answered = m_parameter->update(m_lent) == obd::IQuery::UpdateStatus::UpdateOk;
    if (m_derived) {
        m_everAsked.insert(m_proxy.asked().begin(), m_proxy.asked().end());
    }
    if (!m_answered || (m_derived && !inputsAreFresh(start))) {
        return std::nullopt;
    }
    return result();
}

Reading PolledParameter::reading(obd::SensorInfo const& info, bool alone) const
{
    int const pid = m_parameter->pid();
    std::string const title = m_parameter->description(*m_ecu);
    Reading reading;
    reading.time = std::chrono::system_clock::now();
    reading.module = m_ecu->id();
    reading.sensor = alone ? sensorKey(pid) : fmt::format("{}_{}", sensorKey(pid), info.uid() % 10 + 1);
    reading.pid = m_derived ? std::string() : fmt::format("01{:02X}", pid);
    reading.name = alone ? title : title + ": " + info.description();
    MeasurementUnit const unit = info.unit(librarySystem(m_units));
    reading.unit = labelInUnits(unitLabel(info.uid(), unit), unit, m_units);
    reading.raw = m_derived ? std::vector<unsigned char>() : m_raw;
    return reading;
}

PollResult PolledParameter::result()
{
    PollResult result{m_ecu->id(), m_parameter->pid(), {}, {}};
    auto const infos = m_parameter->sensorInfo(*m_ecu);
    for (std::shared_ptr<obd::SensorValue> const& value : m_parameter->values(*m_ecu, librarySystem(m_units))) {
        auto const info =
            std::find_if(infos.begin(), infos.end(), [&](auto const& each) { return each->uid() == value->uid(); });
        if (info == infos.end()) {
            continue;
        }
        Reading reading = this->reading(**info, infos.size() == 1);
        if (auto const number = std::dynamic_pointer_cast<obd::NumericSensorValue>(value)) {
            double const shown = inUnits(shownNumber(value->uid(), number->numericValue()),
                                         (*info)->unit(librarySystem(m_units)), m_units);
            SensorStatistics& statistics = m_statistics[value->uid()];
            statistics.add(shown);
            reading.value = shown;
            reading.precision = decimalsOf(*number);
            result.values.push_back(std::make_shared<obd::SensorValueDataModel>(statistics.model(*number)));
        } else {
            reading.value = value->textualValue();
            if (std::optional<double> const digits = value->number()) {
                reading.value = *digits;
            }
            result.values.push_back(std::make_shared<obd::SensorValueDataModel>(value->uid(), value->textualValue()));
        }
        result.readings.push_back(std::move(reading));
    }
    return result;
}

} // namespace velmora
