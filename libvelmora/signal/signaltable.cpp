#include "libvelmora/signal/signaltable.h"

#include "libvelmora/signal/formulaparser.h"
#include "libvelmora/signal/signalhex.h"

#include <algorithm>
#include <cmath>
#include <functional>
#include <map>

namespace velmora {

namespace {

class SignalReader
{
public:
    SignalReader(toml::table const& table, std::string const& place, std::vector<SignalMistake>& mistakes)
        : m_table(table), m_place(place), m_mistakes(mistakes)
    {}

    Signal read()
    {
        for (auto const& [key, node] : m_table) {
            auto const found = readers().find(key.str());
            if (found == readers().end()) {
                mistake(node, std::string(key.str()), "is no key of a signal");
            } else {
                m_key = found->first;
                found->second(*this, node);
            }
        }
        checkWhole();
        return std::move(m_signal);
    }

private:
    using Reader = std::function<void(SignalReader&, toml::node const&)>;

    void mistake(toml::node const& node, std::string const& key, std::string const& what)
    {
        m_mistakes.push_back({node.source().begin.line, m_place + ", " + key, what});
    }

    void wrong(toml::node const& node, std::string const& what) { mistake(node, m_key, what); }

    void missing(std::string const& key, std::string const& what)
    {
        m_mistakes.push_back({m_table.source().begin.line, m_place + ", " + key, what});
    }

    static Reader text(std::string Signal::*field)
    {
        return [field](SignalReader& reader, toml::node const& node) {
            if (!node.is_string() || node.value_or(std::string()).empty()) {
                return reader.wrong(node, "must be a text that is not empty");
            }
            reader.m_signal.*field = node.value_or(std::string());
        };
    }

    static Reader number(std::optional<double> Signal::*field, double lowest)
    {
        return [field, lowest](SignalReader& reader, toml::node const& node) {
            std::optional<double> const value = node.is_number() ? node.value<double>() : std::nullopt;
            if (!value || !std::isfinite(*value) || *value < lowest) {
                return reader.wrong(node, "must be a number" +
                                              (lowest > -1e300 ? " of at least " + std::to_string(lowest) : ""));
            }
            reader.m_signal.*field = value;
        };
    }

    std::optional<std::string> hexOf(toml::node const& node, std::initializer_list<std::size_t> lengths)
    {
        auto const digits = node.is_string() ? hexDigits(node.value_or(std::string())) : std::nullopt;
        if (!digits || std::find(lengths.begin(), lengths.end(), digits->size()) == lengths.end()) {
            std::string list;
            for (std::size_t const length : lengths) {
                list += (list.empty() ? "" : ", ") + std::to_string(length);
            }
            wrong(node, "must be a text of hexadecimal digits, as many as one of " + list);
            return std::nullopt;
        }
        return digits;
    }

    // A CAN identifier of 11 or 29 bits, or the three header bytes of the legacy buses.
    static Reader identifier(std::string Signal::*field)
    {
        return [field](SignalReader& reader, toml::node const& node) {
            if (auto const digits = reader.hexOf(node, {3, 6, 8})) {
                reader.m_signal.*field = *digits;
            }
        };
    }

    static Reader address(std::optional<unsigned char> Signal::*field)
    {
        return [field](SignalReader& reader, toml::node const& node) {
            if (auto const digits = reader.hexOf(node, {2})) {
                reader.m_signal.*field = hexBytes(*digits)->front();
            }
        };
    }

    template <typename Number, typename Field>
    static Reader count(Field Signal::*field, int64_t lowest, int64_t highest)
    {
        return [field, lowest, highest](SignalReader& reader, toml::node const& node) {
            auto const value = node.is_integer() ? node.value<int64_t>() : std::nullopt;
            if (!value || *value < lowest || *value > highest) {
                return reader.wrong(node, "must be a whole number from " + std::to_string(lowest) + " to " +
                                              std::to_string(highest));
            }
            reader.m_signal.*field = static_cast<Number>(*value);
        };
    }

    void readRequest(toml::node const& node)
    {
        auto const bytes = node.is_string() ? hexBytes(node.value_or(std::string())) : std::nullopt;
        if (!bytes) {
            return wrong(node, "must be a text of whole bytes in hexadecimal, such as \"220101\"");
        }
        if (auto const refusal = refusalOf(*bytes)) {
            return wrong(node, *refusal);
        }
        m_signal.request = *bytes;
    }

    void readFormula(toml::node const& node)
    {
        if (!node.is_string()) {
            return wrong(node, "must be a text");
        }
        try {
            m_signal.formula = parseFormula(node.value_or(std::string()));
        } catch (FormulaError const& error) {
            wrong(node, std::string(error.what()) + " (at character " + std::to_string(error.position() + 1) + ")");
        }
    }

    void readText(toml::node const& node)
    {
        toml::table const* const table = node.as_table();
        auto const first = table != nullptr ? (*table)["first"].value<int64_t>() : std::nullopt;
        auto const size = table != nullptr ? (*table)["count"].value_or(int64_t{0}) : 0;
        if (!first || *first < 0 || *first > 701 || size < 0 || size > 702 || table->size() > 2) {
            return wrong(node, "must be { first = BYTE, count = BYTES }, counted from 0 behind the echo");
        }
        m_signal.text = SignalText{static_cast<std::size_t>(*first), static_cast<std::size_t>(size)};
    }

    void readValues(toml::node const& node)
    {
        toml::table const* const table = node.as_table();
        if (table == nullptr || table->empty()) {
            return wrong(node, "must be a table of texts, such as { 0 = \"off\", 1 = \"on\" }");
        }
        for (auto const& [key, value] : *table) {
            std::string const name(key.str());
            char* end = nullptr;
            long const numeral = std::strtol(name.c_str(), &end, 10);
            if (name.empty() || *end != '\0' || !value.is_string()) {
                wrong(value, "\"" + name + "\" must be a whole number with a text");
            } else {
                m_signal.values[numeral] = value.value_or(std::string());
            }
        }
    }

    void readFlowControl(toml::node const& node)
    {
        toml::table const* const table = node.as_table();
        auto const header = table != nullptr ? hexDigits((*table)["header"].value_or(std::string())) : std::nullopt;
        auto const data = table != nullptr ? hexBytes((*table)["data"].value_or(std::string())) : std::nullopt;
        bool const fits = header && (header->size() == 3 || header->size() == 6 || header->size() == 8) && data &&
                          !data->empty() && data->size() <= 5 && table->size() == 2;
        if (!fits) {
            return wrong(node, "must be { header = \"7B3\", data = \"300000\" }, with one to five bytes");
        }
        m_signal.flowControl = SignalFlowControl{*header, *data};
    }

    void readEnabled(toml::node const& node)
    {
        if (!node.is_boolean()) {
            return wrong(node, "must be true or false");
        }
        m_signal.enabled = node.value_or(true);
    }

    void readVerified(toml::node const& node)
    {
        toml::table const* const table = node.as_table();
        m_signal.verifiedBy = table != nullptr ? (*table)["by"].value_or(std::string()) : std::string();
        m_signal.verifiedOn = table != nullptr ? (*table)["on"].value_or(std::string()) : std::string();
        if (m_signal.verifiedBy.empty() || m_signal.verifiedOn.empty() || table->size() != 2) {
            wrong(node, "must be { by = \"who\", on = \"2026-03-01\" }");
        }
    }

    static std::map<std::string, Reader, std::less<>> const& readers()
    {
        static std::map<std::string, Reader, std::less<>> const all = {
            {"id", &SignalReader::readId},
            {"name", text(&Signal::name)},
            {"unit", text(&Signal::unit)},
            {"reason", text(&Signal::reason)},
            {"header", identifier(&Signal::header)},
            {"reply", identifier(&Signal::reply)},
            {"ext", address(&Signal::extendedAddress)},
            {"tester", address(&Signal::tester)},
            {"request", &SignalReader::readRequest},
            {"formula", &SignalReader::readFormula},
            {"text", &SignalReader::readText},
            {"values", &SignalReader::readValues},
            {"flow", &SignalReader::readFlowControl},
            {"length", count<std::size_t>(&Signal::length, 1, 702)},
            {"precision", count<int>(&Signal::precision, 0, 9)},
            {"timeout", count<unsigned int>(&Signal::timeout, 8, 10000)},
            {"min", number(&Signal::min, -1e308)},
            {"max", number(&Signal::max, -1e308)},
            {"rate", number(&Signal::rate, 0.001)},
            {"enabled", &SignalReader::readEnabled},
            {"verified", &SignalReader::readVerified},
        };
        return all;
    }

    void readId(toml::node const& node)
    {
        std::string const id = node.value_or(std::string());
        auto const fits = [](char each) {
            return (each >= 'A' && each <= 'Z') || (each >= '0' && each <= '9') || each == '_';
        };
        if (!node.is_string() || id.empty() || id.size() > 64 || !std::all_of(id.begin(), id.end(), fits)) {
            return wrong(node, "must be a text of capitals, digits and '_'");
        }
        m_signal.id = id;
    }

    // What no key alone tells.
    void checkWhole()
    {
        if (!m_table.contains("id")) {
            missing("id", "is missing");
        }
        if (!m_table.contains("name")) {
            missing("name", "is missing");
        }
        if (m_table.contains("formula") == m_table.contains("text")) {
            missing("formula", "each signal wants either a formula or a text");
        }
        if (!m_table.contains("request") && (!m_signal.formula || bytesReadBy(*m_signal.formula) > 0)) {
            missing("request", "is missing; only a formula of other signals' values needs none");
        }
        checkAddresses();
        if (m_signal.min && m_signal.max && *m_signal.min >= *m_signal.max) {
            missing("min", "must be less than max");
        }
    }

    void checkAddresses()
    {
        bool const standard = m_signal.header.empty() || standardReply(m_signal.header);
        if (!standard && !m_table.contains("reply")) {
            missing("reply", "is missing; only 7E0 to 7E7 and 18DAxxF1 have replies that follow from the header");
        }
        if (m_signal.extendedAddress && m_signal.header.empty()) {
            missing("ext", "needs a header");
        }
        if (m_signal.extendedAddress && m_signal.request.size() > 6) {
            missing("request", "holds at most six bytes behind an extended address");
        }
    }

    toml::table const& m_table;
    std::string const& m_place;
    std::vector<SignalMistake>& m_mistakes;
    std::string m_key; // that is being read
    Signal m_signal;
};

} // namespace

Signal readSignal(toml::table const& table, std::string const& place, std::vector<SignalMistake>& mistakes)
{
    return SignalReader(table, place, mistakes).read();
}

} // namespace velmora
