#include "libvelmora/uds/signalboard.h"

#include "common/text/text.h"
#include "libvelmora/signal/signalhex.h"

#include <fmt/format.h>

#include <algorithm>
#include <cmath>
#include <utility>

namespace velmora {

namespace {

// Values that others are worked out of are read at rates of their own.
constexpr std::chrono::seconds oldestValue{10};
constexpr int deepestReference = 16;

std::string fixedText(double number, int precision)
{
    std::string const text = fmt::format("{:.{}f}", number, std::clamp(precision, 0, 9));
    bool const zero = text.find_first_not_of("-0.") == std::string::npos;
    return zero && text.starts_with('-') ? text.substr(1) : text;
}

bool isPrintable(unsigned char byte)
{
    return byte > ' ' && byte < 0x7F;
}

} // namespace

std::optional<std::string> textOf(SignalText const& text, std::vector<unsigned char> const& data)
{
    std::size_t const count = text.count != 0 ? text.count : data.size() - std::min(data.size(), text.first);
    if (count == 0 || data.size() < text.first + count) {
        return std::nullopt;
    }
    auto first = data.begin() + static_cast<std::ptrdiff_t>(text.first);
    auto last = first + static_cast<std::ptrdiff_t>(count);
    while (first != last && !isPrintable(*first)) {
        ++first;
    }
    while (first != last && !isPrintable(*(last - 1))) {
        --last;
    }
    return readable(std::string(first, last));
}

std::optional<double> SignalBoard::lastOf(std::size_t index, Time now) const
{
    auto const found = m_last.find(index);
    if (found == m_last.end()) {
        return std::nullopt;
    }
    SignalEntry const& entry = (*m_set)[index];
    std::chrono::duration<double> const age = now - found->second.time;
    double const oldest = std::max(std::chrono::duration<double>(oldestValue).count(),
                                   entry.signal.rate ? 3.0 / *entry.signal.rate : 0.0);
    return age.count() <= oldest ? std::optional(found->second.number) : std::nullopt;
}

std::optional<double> SignalBoard::valueOf(std::size_t index, std::string const& id, Time now, WorkedOut& known,
                                           int depth) const
{
    std::optional<std::size_t> const other = m_set->sibling(index, id);
    if (!other || depth > deepestReference) {
        return std::nullopt;
    }
    SignalEntry const& entry = (*m_set)[*other];
    if (!entry.signal.request.empty() || !entry.signal.formula) {
        return lastOf(*other, now);
    }
    if (auto const found = known.find(*other); found != known.end()) {
        return found->second;
    }
    std::optional<double> const value =
        evaluate(*entry.signal.formula,
                 {{}, [&](std::string const& name) { return valueOf(*other, name, now, known, depth + 1); }});
    known.emplace(*other, value);
    return value;
}

std::optional<double> SignalBoard::evaluateEntry(std::size_t index, std::vector<unsigned char> const& data,
                                                 Time now) const
{
    SignalEntry const& entry = (*m_set)[index];
    WorkedOut known;
    FormulaInput const input{data, [&](std::string const& id) { return valueOf(index, id, now, known, 0); }};
    if (!entry.signal.formula || (entry.supported && evaluate(*entry.supported, input) != 1.0)) {
        return std::nullopt;
    }
    return evaluate(*entry.signal.formula, input);
}

Reading SignalBoard::reading(std::size_t index, unsigned int module) const
{
    Signal const& signal = (*m_set)[index].signal;
    Reading reading;
    reading.time = std::chrono::system_clock::now();
    reading.module = module;
    reading.sensor = signal.id;
    reading.pid = hexText(signal.request);
    reading.name = signal.name;
    reading.unit = signal.unit;
    reading.precision = signal.precision;
    return reading;
}

void SignalBoard::countMissing(std::size_t index)
{
    std::lock_guard const lock(m_mutex);
    ++m_troubles[index].withoutValue;
}

PollResult SignalBoard::result(ChosenSignal const& signal, unsigned int module, Reading reading)
{
    int const id = signalId(signal.index);
    int const uid = obd::Pid2Uid(id);
    PollResult result{module, static_cast<obd::ParameterIdentifier::Id>(id), {}, {}};
    if (auto const* const number = std::get_if<double>(&reading.value)) {
        Statistics& each = m_statistics[signal.index];
        each.minimum = each.count == 0 ? *number : std::min(each.minimum, *number);
        each.maximum = each.count == 0 ? *number : std::max(each.maximum, *number);
        each.sum += *number;
        ++each.count;
        auto const text = [&](double value) { return fixedText(value, reading.precision); };
        double const mean = each.sum / each.count;
        auto values = std::make_shared<obd::SensorValueDataModel>(uid, text(*number), text(each.minimum),
                                                                  text(each.maximum), text(mean));
        values->number = *number;
        values->statistics = {each.minimum, each.maximum, mean, each.count};
        result.values.push_back(std::move(values));
    } else if (auto const* const words = std::get_if<std::string>(&reading.value)) {
        result.values.push_back(std::make_shared<obd::SensorValueDataModel>(uid, *words));
    }
    result.readings.push_back(std::move(reading));
    return result;
}

PollResult SignalBoard::take(ChosenSignal const& signal, unsigned int module, unsigned int answered,
                             std::vector<unsigned char> const& payload, Time now)
{
    SignalEntry const& entry = (*m_set)[signal.index];
    Reading reading = this->reading(signal.index, answered);
    reading.raw = payload;
    std::size_t const echo = std::min(echoLength(entry.signal.request), payload.size());
    std::vector<unsigned char> const data(payload.begin() + static_cast<std::ptrdiff_t>(echo), payload.end());
    bool const fits = entry.length == 0 || data.size() == entry.length;
    if (fits && entry.signal.text) {
        if (std::optional<std::string> const text = textOf(*entry.signal.text, data)) {
            reading.value = *text;
        }
    } else if (std::optional<double> const number =
                   fits ? evaluateEntry(signal.index, data, now) : std::optional<double>()) {
        m_last[signal.index] = {*number, now};
        reading.value = *number;
        auto const word = std::floor(*number) == *number && std::fabs(*number) < 1e9
                              ? entry.signal.values.find(static_cast<long>(*number))
                              : entry.signal.values.end();
        if (word != entry.signal.values.end()) {
            reading.value = word->second;
        }
    }
    if (std::holds_alternative<std::monostate>(reading.value)) {
        m_last.erase(signal.index);
        countMissing(signal.index);
    }
    return result(signal, module, std::move(reading));
}

PollResult SignalBoard::takeNothing(ChosenSignal const& signal, unsigned int module)
{
    m_last.erase(signal.index);
    countMissing(signal.index);
    return result(signal, module, reading(signal.index, module));
}

std::optional<PollResult> SignalBoard::workOut(ChosenSignal const& signal, Time now)
{
    std::optional<double> const number = evaluateEntry(signal.index, {}, now);
    if (!number) {
        return std::nullopt;
    }
    Reading reading = this->reading(signal.index, signal.module.value_or(0));
    reading.value = *number;
    return result(signal, signal.module.value_or(0), std::move(reading));
}

void SignalBoard::setReason(std::vector<ChosenSignal> const& signals, std::string const& reason)
{
    std::lock_guard const lock(m_mutex);
    for (ChosenSignal const& each : signals) {
        m_troubles[each.index].reason = reason;
    }
}

std::vector<SignalTrouble> SignalBoard::troubles() const
{
    std::lock_guard const lock(m_mutex);
    std::vector<SignalTrouble> troubles;
    for (auto const& [index, trouble] : m_troubles) {
        if (trouble.withoutValue != 0 || !trouble.reason.empty()) {
            troubles.push_back(trouble);
            troubles.back().id = (*m_set)[index].signal.id;
        }
    }
    return troubles;
}

} // namespace velmora
