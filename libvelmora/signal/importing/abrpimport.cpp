#include "libvelmora/signal/formulaparser.h"
#include "libvelmora/signal/importing/importedrow.h"
#include "libvelmora/signal/importing/jsonsource.h"
#include "libvelmora/signal/signalhex.h"

namespace velmora {

namespace {

using nlohmann::json;

// What the adapter is told before and between the requests, as far as it matters here.
struct AbrpSetup
{
    bool wholeFrames = false; // it is left printing whole frames, so that equations count other bytes
    std::string session;      // that is opened
};

AbrpSetup setupOf(json const& document)
{
    AbrpSetup setup;
    for (char const* const group : {"init_commands", "data_commands"}) {
        json const& commands = memberOf(memberOf(document, group), "command");
        for (json const& command : commands) {
            std::string const text = command.is_string() ? command.get<std::string>() : std::string();
            std::string const digits = hexDigits(text).value_or(std::string());
            setup.wholeFrames = setup.wholeFrames || text.find("CAF0") != std::string::npos;
            setup.session = digits.size() == 4 && digits.starts_with("10") ? digits : setup.session;
        }
    }
    return setup;
}

class AbrpImporter
{
public:
    explicit AbrpImporter(std::string const& path) : m_collector(path) {}

    SignalImport import(json const& document)
    {
        m_setup = setupOf(document);
        for (auto const& [name, entry] : document.items()) {
            ++m_number;
            if (memberOf(entry, "equation").is_null()) {
                continue;
            }
            if (m_setup.wholeFrames) {
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
        fillRange(signal, numberOf(entry, "minValue"), numberOf(entry, "maxValue"));
        readMeanings(signal, entry);
        if (!m_setup.session.empty()) {
            requireSession(signal, "session " + m_setup.session);
        }
        m_collector.addNamed(m_number, std::move(signal));
    }

    static void readMeanings(Signal& signal, json const& entry)
    {
        if (textOf(entry, "type") == "Boolean") {
            signal.precision = 0;
            signal.values = {{0, "no"}, {1, "yes"}};
        }
    }

    ImportCollector m_collector;
    AbrpSetup m_setup;
    std::size_t m_number = 0; // of the key, in the place of a line
};

} // namespace

SignalImport importAbrp(std::string_view text, std::string const& path)
{
    json const document = parseJson(text, path);
    return AbrpImporter(path).import(document.is_object() ? document : json::object());
}

} // namespace velmora
