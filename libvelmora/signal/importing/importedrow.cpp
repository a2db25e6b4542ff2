#include "libvelmora/signal/importing/importedrow.h"

#include "libvelmora/signal/signalhex.h"
#include "libvelmora/signal/signalreferences.h"

#include <algorithm>
#include <cctype>
#include <utility>

namespace velmora {

namespace {

char const* const assumedReply = "the reply identifier is assumed, not told by the file";

// The answer of an 11-bit identifier that is none of OBD: eight above it, as most makers pair them.
std::optional<std::string> eightAbove(std::string const& header)
{
    unsigned int const id = static_cast<unsigned int>(std::stoul(header, nullptr, 16));
    if (id + 8 > 0x7FF) {
        return std::nullopt;
    }
    constexpr char const* digits = "0123456789ABCDEF";
    unsigned int const reply = id + 8;
    return std::string{digits[reply >> 8U], digits[reply >> 4U & 0xFU], digits[reply & 0xFU]};
}

// A name that is not known stays, to be found missing.
void renameValues(FormulaNode& formula, std::map<std::string, std::string> const& idOf)
{
    if (formula.step == FormulaStep::Value) {
        auto const found = idOf.find(formula.name);
        formula.name = found != idOf.end() ? found->second : formula.name;
    }
    for (FormulaNode& operand : formula.operands) {
        renameValues(operand, idOf);
    }
}

} // namespace

std::string ImportCollector::newId(std::string const& name)
{
    std::string id;
    for (char const each : name) {
        auto const byte = static_cast<unsigned char>(each);
        if (byte < 0x80 && std::isalnum(byte) != 0) {
            id += static_cast<char>(std::toupper(byte));
        } else if (!id.empty() && id.back() != '_') {
            id += '_';
        }
    }
    id = id.substr(0, 56);
    while (!id.empty() && id.back() == '_') {
        id.pop_back();
    }
    id = id.empty() ? "SIGNAL" : id;
    std::string numbered = id;
    for (int number = 2; !m_ids.insert(numbered).second; ++number) {
        numbered = id + "_" + std::to_string(number);
    }
    return numbered;
}

void ImportCollector::refuse(std::size_t line, std::string const& what, std::string const& why)
{
    m_import.refused.push_back({line, what, why});
}

void ImportCollector::note(std::size_t line, std::string const& what, std::string const& why)
{
    m_import.notes.push_back({line, what, why});
}

void ImportCollector::add(std::size_t line, Signal signal)
{
    m_idOf.emplace(signal.name, signal.id);
    m_lines.push_back(line);
    m_import.file.signals.push_back(std::move(signal));
}

void ImportCollector::addNamed(std::size_t line, Signal signal)
{
    signal.id = newId(signal.name);
    if (!signal.reason.empty()) {
        note(line, signal.name, signal.reason);
    }
    add(line, std::move(signal));
}

// One that goes takes those with it that read it.
void ImportCollector::dropUnresolved()
{
    std::vector<Signal>& signals = m_import.file.signals;
    std::vector<Signal> kept;
    std::vector<std::size_t> const broken = brokenReferences(signals);
    auto next = broken.begin();
    for (std::size_t i = 0; i < signals.size(); ++i) {
        if (next != broken.end() && *next == i) {
            refuse(m_lines[i], signals[i].name, "its formula reads a value that is not in this file, or its own");
            ++next;
        } else {
            kept.push_back(std::move(signals[i]));
        }
    }
    signals = std::move(kept);
}

SignalImport ImportCollector::finish()
{
    for (Signal& signal : m_import.file.signals) {
        if (signal.formula) {
            renameValues(*signal.formula, m_idOf);
        }
    }
    dropUnresolved();
    auto const byLine = [](SignalMistake const& left, SignalMistake const& right) { return left.line < right.line; };
    std::stable_sort(m_import.refused.begin(), m_import.refused.end(), byLine);
    return std::move(m_import);
}

bool fillAddresses(Signal& signal, std::string const& header)
{
    auto const digits = hexDigits(header);
    if (!digits || (!digits->empty() && digits->size() != 3 && digits->size() != 6 && digits->size() != 8)) {
        return false;
    }
    signal.header = *digits;
    if (digits->empty() || isFunctionalHeader(*digits) || standardReply(*digits)) {
        return true;
    }
    if (digits->size() == 3) {
        auto const reply = eightAbove(*digits);
        signal.reply = reply.value_or("");
    } else {
        signal.reply = swappedReply(*digits).value_or("");
    }
    signal.reason = assumedReply;
    return !signal.reply.empty();
}

void requireSession(Signal& signal, std::string const& what)
{
    signal.enabled = false;
    signal.reason = "needs " + what + ", which is not opened";
}

void fillRange(Signal& signal, std::optional<double> min, std::optional<double> max)
{
    bool const told = min && max && *min < *max;
    signal.min = told ? min : std::nullopt;
    signal.max = told ? max : std::nullopt;
}

std::string knownUnit(std::string const& unit)
{
    static std::map<std::string, std::string> const labels = {
        {"C", "°C"},     {"degC", "°C"},  {"Deg C", "°C"},  {"F", "°F"},        {"degF", "°F"}, {"deg", "°"},
        {"kph", "km/h"}, {"KPH", "km/h"}, {"kmh", "km/h"},  {"RPM", "rpm"},     {"sec", "s"},   {"Volt", "V"},
        {"volts", "V"},  {"Amps", "A"},   {"percent", "%"}, {"minutes", "min"},
    };
    auto const found = labels.find(unit);
    return found == labels.end() ? unit : found->second;
}

} // namespace velmora
