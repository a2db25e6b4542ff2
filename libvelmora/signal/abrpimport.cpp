#include "libvelmora/signal/formulaparser.h"
#include "libvelmora/signal/importedrow.h"
#include "libvelmora/signal/jsonsource.h"
#include "libvelmora/signal/signalhex.h"

#include <algorithm>

namespace velmora {

namespace {

using nlohmann::json;

// Commands that leave the adapter printing whole frames, so that equations count other bytes.
bool printsWholeFrames(json const& document)
{
    for (char const* const group : {"init_commands", "data_commands"}) {
        json const& commands = memberOf(memberOf(document, group), "command");
        for (json const& command : commands) {
            if (command.is_string() && command.get<std::string>().find("CAF0") != std::string::npos) {
                return true;
            }
        }
    }
    return false;
}

class AbrpImporter
{
public:
    explicit AbrpImporter(std::string const& path) : m_collector(path) {}

    SignalImport import(json const& document)
    {
        bool const wholeFrames = printsWholeFrames(document);
        for (auto const& [name, entry] : document.items()) {
            ++m_number;
            if (memberOf(entry, "equation").is_null()) {
                continue;
            }
            if (wholeFrames) {
                m_collector.refuse(m_number, name, "its file asks with whole frames (CAF0), which count other bytes");
            } else {
                read(name, entry);
            }
        }
        return m_collector.finish();
    }

private:
    void read(std::string const& name, json const& entry)
    {
        Signal signal;
        signal.name = name;
        auto const request = hexBytes(textOf(entry, "command"));
        if (!request) {
            return m_collector.refuse(m_number, name, "its request is not hexadecimal");
        }
        if (auto const refusal = refusalOf(*request)) {
            return m_collector.refuse(m_number, name, *refusal);
        }
        signal.request = *request;
        if (!fillAddresses(signal, textOf(entry, "ecu"))) {
            return m_collector.refuse(m_number, name, "its header is none whose reply could be told");
        }
        try {
            signal.formula = parseFormula(textOf(entry, "equation"), FormulaDialect::Phone);
        } catch (FormulaError const& error) {
            return m_collector.refuse(m_number, name, std::string("equation: ") + error.what());
        }
        readRange(signal, entry);
        signal.id = m_collector.newId(name);
        if (!signal.reason.empty()) {
            m_collector.note(m_number, name, signal.reason);
        }
        m_collector.add(m_number, std::move(signal));
    }

    static void readRange(Signal& signal, json const& entry)
    {
        signal.min = numberOf(entry, "minValue");
        signal.max = numberOf(entry, "maxValue");
        if (!signal.min || !signal.max || *signal.min >= *signal.max) {
            signal.min = signal.max = std::nullopt;
        }
        if (textOf(entry, "type") == "Boolean") {
            signal.precision = 0;
            signal.values = {{0, "no"}, {1, "yes"}};
        }
    }

    ImportCollector m_collector;
    std::size_t m_number = 0; // of the key, in the place of a line
};

} // namespace

SignalImport importAbrp(std::string_view text, std::string const& path)
{
    json const document = parseJson(text, path);
    return AbrpImporter(path).import(document.is_object() ? document : json::object());
}

} // namespace velmora
