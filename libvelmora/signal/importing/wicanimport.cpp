#include "libvelmora/signal/formulaparser.h"
#include "libvelmora/signal/importing/importedrow.h"
#include "libvelmora/signal/importing/jsonsource.h"
#include "libvelmora/signal/importing/wicanformula.h"
#include "libvelmora/signal/signalhex.h"

#include <algorithm>
#include <regex>

namespace velmora {

namespace {

using nlohmann::json;

// What the adapter is told before a request, as far as it says where to.
struct AdapterSetup
{
    std::string header;
    std::string reply;
    bool extended = false;
    std::string session;
};

AdapterSetup readSetup(AdapterSetup setup, std::string commands)
{
    constexpr std::size_t most = 4096; // the library's regular expressions want stack by the length of a text
    commands.resize(std::min(commands.size(), most));
    static std::regex const pattern(R"(AT *(SH|CRA|CEA)? *([0-9A-F]*)[^;]*;|(10[0-9A-F]{2});)");
    for (std::sregex_iterator each(commands.begin(), commands.end(), pattern), end; each != end; ++each) {
        std::smatch const& match = *each;
        if (match[3].matched) {
            setup.session = match[3];
        } else if (match[1] == "SH") {
            setup.header = match[2];
        } else if (match[1] == "CRA") {
            setup.reply = match[2];
        } else if (match[1] == "CEA") {
            setup.extended = !match[2].str().empty();
        }
    }
    return setup;
}

class WicanImporter
{
public:
    explicit WicanImporter(std::string const& path) : m_collector(path) {}

    SignalImport import(json const& document)
    {
        AdapterSetup const start = readSetup({}, textOf(document, "init"));
        for (json const& entry : memberOf(document, "pids")) {
            ++m_number;
            readRequest(readSetup(start, textOf(entry, "pid_init")), entry);
        }
        return m_collector.finish();
    }

private:
    void readRequest(AdapterSetup const& setup, json const& entry)
    {
        auto digits = hexDigits(textOf(entry, "pid"));
        std::optional<char> count;
        if (digits && digits->size() % 2 != 0) {
            count = digits->back();
            digits->pop_back();
        }
        json const& parameters = memberOf(entry, "parameters");
        if (!parameters.is_object()) {
            return;
        }
        auto const frames = framesOf(parameters, count);
        for (auto const& [name, expression] : parameters.items()) {
            readSignal(setup, digits, frames, name, expression);
        }
    }

    // The same byte has two numbers, by whether the reply comes in one frame; the count digit tells, or a byte beyond
    // one.
    static std::optional<ReplyFrames> framesOf(json const& parameters, std::optional<char> count)
    {
        if (count) {
            return *count == '1' ? ReplyFrames::One : ReplyFrames::Several;
        }
        for (json const& expression : parameters) {
            if (expression.is_string() && highestFrameByte(expression.get<std::string>()) >= 8) {
                return ReplyFrames::Several;
            }
        }
        return std::nullopt;
    }

    void readSignal(AdapterSetup const& setup, std::optional<std::string> const& digits,
                    std::optional<ReplyFrames> frames, std::string const& name, json const& expression)
    {
        auto const request = digits ? hexBytes(*digits) : std::nullopt;
        if (!request || !expression.is_string()) {
            return refuse(name, "it has no request in hexadecimal, or no expression");
        }
        if (auto const refusal = refusalOf(*request)) {
            return refuse(name, *refusal);
        }
        if (!frames) {
            return refuse(name, "whether its reply comes in one frame is not told, and its bytes are counted by that");
        }
        if (setup.extended) {
            return refuse(name, "with extended addresses it is not agreed how such files count bytes");
        }
        Signal signal;
        signal.request = *request;
        signal.name = name;
        if (!readFormula(signal, expression.get<std::string>(), *frames) || !readAddresses(signal, setup)) {
            return;
        }
        m_collector.addNamed(m_number, std::move(signal));
    }

    bool readFormula(Signal& signal, std::string const& expression, ReplyFrames frames)
    {
        try {
            signal.formula = parseFormula(fromFrameBytes(expression, frames, echoLength(signal.request)));
            return true;
        } catch (FormulaError const& error) {
            refuse(signal.name, "expression \"" + expression + "\": " + error.what());
            return false;
        }
    }

    bool readAddresses(Signal& signal, AdapterSetup const& setup)
    {
        bool const told = fillAddresses(signal, setup.header);
        if (!setup.reply.empty() && signal.reply != setup.reply && standardReply(signal.header) != setup.reply) {
            signal.reply = setup.reply;
            signal.reason.clear();
        } else if (!told) {
            refuse(signal.name, "header \"" + setup.header + "\" is none whose reply could be told");
            return false;
        }
        if (!setup.session.empty()) {
            requireSession(signal, "session " + setup.session);
        }
        return true;
    }

    void refuse(std::string const& name, std::string const& why) { m_collector.refuse(m_number, name, why); }

    ImportCollector m_collector;
    std::size_t m_number = 0; // of the request, in the place of a line
};

} // namespace

SignalImport importWican(std::string_view text, std::string const& path)
{
    return WicanImporter(path).import(parseJson(text, path));
}

} // namespace velmora
