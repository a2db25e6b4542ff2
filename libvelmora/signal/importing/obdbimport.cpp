#include "libvelmora/signal/bitfield.h"
#include "libvelmora/signal/importing/importedrow.h"
#include "libvelmora/signal/importing/jsonsource.h"
#include "libvelmora/signal/signalhex.h"

#include <cmath>

namespace velmora {

namespace {

using nlohmann::json;

class ObdbImporter
{
public:
    explicit ObdbImporter(std::string const& path) : m_collector(path) {}

    SignalImport import(json const& document)
    {
        for (json const& command : memberOf(document, "commands")) {
            ++m_number;
            readCommand(command);
        }
        return m_collector.finish();
    }

private:
    void readCommand(json const& command)
    {
        Signal shared;
        std::string const wrong = readShared(shared, command);
        for (json const& entry : memberOf(command, "signals")) {
            std::string const name = textOf(entry, "name").empty() ? textOf(entry, "id") : textOf(entry, "name");
            if (!wrong.empty()) {
                m_collector.refuse(m_number, name, wrong);
            } else {
                readSignal(shared, entry, name);
            }
        }
    }

    // What all signals of a command have in common. What is wrong with it, or an empty text.
    static std::string readShared(Signal& signal, json const& command)
    {
        json const& request = memberOf(command, "cmd");
        if (!request.is_object() || request.size() != 1 || !request.begin().value().is_string()) {
            return "it names no request";
        }
        auto const bytes = hexBytes(request.begin().key() + request.begin().value().get<std::string>());
        if (!bytes) {
            return "its request is not hexadecimal";
        }
        if (auto const refusal = refusalOf(*bytes)) {
            return *refusal;
        }
        signal.request = *bytes;
        return readAddresses(signal, command);
    }

    static std::string readAddresses(Signal& signal, json const& command)
    {
        std::string header = textOf(command, "hdr");
        std::string const first = textOf(command, "pri");
        std::string const last = textOf(command, "tst");
        std::string const extended = textOf(command, "eax");
        if (header.size() == 4) {
            header = (first.empty() ? "18" : first) + header + (last.empty() || !extended.empty() ? "F1" : last);
        }
        if (!fillAddresses(signal, header) && textOf(command, "rax").empty()) {
            return "header \"" + header + "\" is none whose reply could be told";
        }
        if (std::string const reply = textOf(command, "rax"); !reply.empty()) {
            auto const digits = hexDigits(reply);
            if (!digits || (digits->size() != 3 && digits->size() != 8)) {
                return "reply \"" + reply + "\" is no identifier";
            }
            signal.reply = *digits;
            signal.reason.clear();
        }
        return readExtras(signal, command, extended, last);
    }

    static std::string readExtras(Signal& signal, json const& command, std::string const& extended,
                                  std::string const& tester)
    {
        if (!extended.empty()) {
            auto const address = hexBytes(extended);
            auto const replies = hexBytes(tester);
            if (!address || address->size() != 1 || (!tester.empty() && (!replies || replies->size() != 1))) {
                return "its extended address is no byte";
            }
            signal.extendedAddress = address->front();
            if (replies && !replies->empty()) {
                signal.tester = replies->front();
            }
        }
        if (memberOf(command, "fcm1").is_boolean() && memberOf(command, "fcm1").get<bool>()) {
            signal.flowControl = SignalFlowControl{signal.header, {0x30, 0x00, 0x00}};
        }
        if (auto const timeout = hexBytes(textOf(command, "tmo")); timeout && timeout->size() == 1) {
            signal.timeout = static_cast<unsigned int>(std::lround(timeout->front() * 4.096));
        }
        if (auto const pause = numberOf(command, "freq"); pause && *pause > 0.0) {
            signal.rate = 1.0 / *pause;
        }
        if (!memberOf(command, "din").is_null()) {
            std::string const session = textOf(command, "din");
            requireSession(signal, session.empty() ? "a session of its own" : "session " + session);
        }
        return {};
    }

    void readSignal(Signal signal, json const& entry, std::string const& name)
    {
        json const& format = memberOf(entry, "fmt");
        for (char const* const key : {"bix", "mul", "div", "add"}) {
            if (!memberOf(format, key).is_null() && !numberOf(format, key)) {
                return m_collector.refuse(m_number, name, std::string("its ") + key + " is no number");
            }
        }
        auto const length = numberOf(format, "len");
        auto const first = numberOf(format, "bix");
        if (!length || *length < 1 || *length > 64 || (first && (*first < 0 || *first > 5600))) {
            return m_collector.refuse(m_number, name, "it names no bits");
        }
        BitField const field{static_cast<std::size_t>(first.value_or(0.0)), static_cast<std::size_t>(*length),
                             isTrue(format, "blsb"), isTrue(format, "sign")};
        if (auto const wrong = wrongField(field)) {
            return m_collector.refuse(m_number, name, *wrong);
        }
        signal.formula = scaled(rawOf(field), format);
        signal.name = name;
        signal.unit = knownUnit(textOf(format, "unit"));
        fillRange(signal, numberOf(format, "min"), numberOf(format, "max"));
        readMeanings(signal, format);
        if (!memberOf(format, "nullmin").is_null() || !memberOf(format, "nullmax").is_null()) {
            m_collector.note(m_number, name, "the values that stand for none are not left out");
        }
        std::string const id = textOf(entry, "id");
        signal.id = m_collector.newId(id.empty() ? name : id);
        m_collector.add(m_number, std::move(signal));
    }

    static bool isTrue(json const& object, std::string const& key)
    {
        json const& member = memberOf(object, key);
        return member.is_boolean() && member.get<bool>();
    }

    // raw * mul / div + add
    static FormulaNode scaled(FormulaNode raw, json const& format)
    {
        constexpr std::pair<char const*, FormulaStep> steps[] = {
            {"mul", FormulaStep::Multiply}, {"div", FormulaStep::Divide}, {"add", FormulaStep::Add}};
        for (auto const& [key, step] : steps) {
            if (auto const number = numberOf(format, key)) {
                raw = combine(step, std::move(raw), leafNumber(*number));
            }
        }
        return raw;
    }

    static void readMeanings(Signal& signal, json const& format)
    {
        json const& map = memberOf(format, "map");
        if (!map.is_object()) {
            return;
        }
        signal.precision = 0;
        for (auto const& [key, entry] : map.items()) {
            char* end = nullptr;
            long const number = std::strtol(key.c_str(), &end, 10);
            std::string const text =
                textOf(entry, "description").empty() ? textOf(entry, "value") : textOf(entry, "description");
            if (!key.empty() && *end == '\0' && !text.empty()) {
                signal.values[number] = text;
            }
        }
    }

    ImportCollector m_collector;
    std::size_t m_number = 0; // of the command, in the place of a line
};

} // namespace

SignalImport importObdb(std::string_view text, std::string const& path)
{
    return ObdbImporter(path).import(parseJson(text, path));
}

} // namespace velmora
