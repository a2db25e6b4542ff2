#pragma once

#include "libvelmora/signal/signal.h"
#include "libvelmora/text/toml.h"

#include <cstdint>
#include <functional>
#include <initializer_list>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

// Reads the table of one signal: each key by a reader of its own (signalkeys.cpp), then what they make together
// (signaltable.cpp).
class SignalReader
{
public:
    // All must outlive it; what is wrong is added to the mistakes, with the place in front.
    SignalReader(toml::table const& table, std::string const& place, std::vector<SignalMistake>& mistakes)
        : m_table(table), m_place(place), m_mistakes(mistakes)
    {}

    Signal read();

private:
    using Reader = std::function<void(SignalReader&, toml::node const&)>;

    static std::map<std::string, Reader, std::less<>> const& readers();

    static Reader text(std::string Signal::*field);
    static Reader number(std::optional<double> Signal::*field, std::optional<double> lowest);
    static Reader identifier(std::string Signal::*field);
    static Reader address(std::optional<unsigned char> Signal::*field);
    template <typename Number, typename Field>
    static Reader count(Field Signal::*field, int64_t lowest, int64_t highest);

    std::optional<std::string> hexOf(toml::node const& node, std::initializer_list<std::size_t> lengths);
    void readId(toml::node const& node);
    void readRequest(toml::node const& node);
    void readFormula(toml::node const& node);
    void readText(toml::node const& node);
    void readValues(toml::node const& node);
    void readFlowControl(toml::node const& node);
    void readEnabled(toml::node const& node);
    void readVerified(toml::node const& node);

    void checkWhole();
    void checkAddresses();

    void mistake(toml::node const& node, std::string const& key, std::string const& what);
    void wrong(toml::node const& node, std::string const& what) { mistake(node, m_key, what); }
    void missing(std::string const& key, std::string const& what);

    toml::table const& m_table;
    std::string const& m_place;
    std::vector<SignalMistake>& m_mistakes;
    std::string m_key; // that is being read
    Signal m_signal;
};

} // namespace velmora
