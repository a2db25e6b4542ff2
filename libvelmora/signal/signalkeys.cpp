// What each key of a signal may hold.

#include "libvelmora/signal/formulaparser.h"
#include "libvelmora/signal/signalhex.h"
#include "libvelmora/signal/signalreader.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>

namespace velmora {

SignalReader::Reader SignalReader::text(std::string Signal::*field)
{
    return [field](SignalReader& reader, toml::node const& node) {
        if (!node.is_string() || node.value_or(std::string()).empty()) {
            return reader.wrong(node, "must be a text that is not empty");
        }
        reader.m_signal.*field = node.value_or(std::string());
    };
}

SignalReader::Reader SignalReader::number(std::optional<double> Signal::*field, std::optional<double> lowest)
{
    return [field, lowest](SignalReader& reader, toml::node const& node) {
        std::optional<double> const value = node.is_number() ? node.value<double>() : std::nullopt;
        if (!value || !std::isfinite(*value) || (lowest && *value < *lowest)) {
            return reader.wrong(node, "must be a number" + (lowest ? " of at least " + std::to_string(*lowest) : ""));
        }
        reader.m_signal.*field = value;
    };
}

std::optional<std::string> SignalReader::hexOf(toml::node const& node, std::initializer_list<std::size_t> lengths)
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
SignalReader::Reader SignalReader::identifier(std::string Signal::*field)
{
    return [field](SignalReader& reader, toml::node const& node) {
        if (auto const digits = reader.hexOf(node, {3, 6, 8})) {
            reader.m_signal.*field = *digits;
        }
    };
}

SignalReader::Reader SignalReader::address(std::optional<unsigned char> Signal::*field)
{
    return [field](SignalReader& reader, toml::node const& node) {
        if (auto const digits = reader.hexOf(node, {2})) {
            reader.m_signal.*field = hexBytes(*digits)->front();
        }
    };
}

template <typename Number, typename Field>
SignalReader::Reader SignalReader::count(Field Signal::*field, int64_t lowest, int64_t highest)
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

void SignalReader::readRequest(toml::node const& node)
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

void SignalReader::readFormula(toml::node const& node)
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

void SignalReader::readText(toml::node const& node)
{
    toml::table const none;
    toml::table const& table = node.is_table() ? *node.as_table() : none;
    auto const first = table["first"].value<int64_t>();
    auto const size = table["count"].value_or(int64_t{0});
    if (!first || *first < 0 || *first > 701 || size < 0 || size > 702 || table.size() > 2) {
        return wrong(node, "must be { first = BYTE, count = BYTES }, counted from 0 behind the echo");
    }
    m_signal.text = SignalText{static_cast<std::size_t>(*first), static_cast<std::size_t>(size)};
}

void SignalReader::readValues(toml::node const& node)
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

void SignalReader::readFlowControl(toml::node const& node)
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

void SignalReader::readEnabled(toml::node const& node)
{
    auto const* const value = node.as_boolean();
    if (value == nullptr) {
        return wrong(node, "must be true or false");
    }
    m_signal.enabled = value->get();
}

void SignalReader::readVerified(toml::node const& node)
{
    toml::table const* const table = node.as_table();
    m_signal.verifiedBy = table != nullptr ? (*table)["by"].value_or(std::string()) : std::string();
    m_signal.verifiedOn = table != nullptr ? (*table)["on"].value_or(std::string()) : std::string();
    if (m_signal.verifiedBy.empty() || m_signal.verifiedOn.empty() || table->size() != 2) {
        wrong(node, "must be { by = \"who\", on = \"2026-03-01\" }");
    }
}

void SignalReader::readId(toml::node const& node)
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

std::map<std::string, SignalReader::Reader, std::less<>> const& SignalReader::readers()
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
        {"min", number(&Signal::min, {})},
        {"max", number(&Signal::max, {})},
        {"rate", number(&Signal::rate, 0.001)},
        {"enabled", &SignalReader::readEnabled},
        {"verified", &SignalReader::readVerified},
    };
    return all;
}

} // namespace velmora
