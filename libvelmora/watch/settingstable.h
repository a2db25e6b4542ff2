#pragma once

#include "libvelmora/text/toml.h"
#include "libvelmora/watch/watchsettings.h"

#include <functional>
#include <map>
#include <string>
#include <vector>

namespace velmora {

// Reads tables of a settings file and takes down what is wrong with them, so that all is told at once.
class SettingsTable
{
public:
    // What to do with the value of a key, which is told with the tables around it: "battery.low_volts".
    using Taker = std::function<void(toml::node const&, std::string const& key)>;

    explicit SettingsTable(std::string file) : m_file(std::move(file)) {}

    // Hands each value to the taker of its key. A key without one is a mistake.
    void read(toml::table const& table, std::string const& prefix, std::map<std::string, Taker> const& takers);
    void mistake(toml::node const& node, std::string const& key, std::string const& what);
    std::vector<std::string> const& mistakes() const { return m_mistakes; }

    // Takers of a text or a truth, of a time in quotes, and of volts of a 12 V system.
    template <typename T>
    Taker into(T& target, char const* expected)
    {
        return [this, &target, expected](toml::node const& node, std::string const& key) {
            if (std::optional<T> const value = node.value_exact<T>()) {
                target = *value;
            } else {
                mistake(node, key, std::string("must be ") + expected);
            }
        };
    }
    template <typename Duration>
    Taker duration(Duration& target)
    {
        return [this, &target](toml::node const& node, std::string const& key) {
            auto const value = parseDuration(node.value_exact<std::string>().value_or(""));
            if (value && std::chrono::floor<Duration>(*value).count() > 0) {
                target = std::chrono::floor<Duration>(*value);
            } else {
                mistake(node, key, "must be a time in quotes, such as \"90s\" or \"10min\"");
            }
        };
    }
    Taker volts(double& target, double lowest);

private:
    std::string const m_file;
    std::vector<std::string> m_mistakes;
};

} // namespace velmora
