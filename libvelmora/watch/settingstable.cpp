#include "libvelmora/watch/settingstable.h"

#include <fmt/format.h>

namespace velmora {

namespace {

constexpr double highestVolts = 16.0;

} // namespace

void SettingsTable::mistake(toml::node const& node, std::string const& key, std::string const& what)
{
    m_mistakes.push_back(fmt::format("{}:{}: {}: {}", m_file, node.source().begin.line, key, what));
}

void SettingsTable::read(toml::table const& table, std::string const& prefix,
                         std::map<std::string, Taker> const& takers)
{
    for (auto const& [key, node] : table) {
        std::string const name(key.str());
        auto const found = takers.find(name);
        if (found != takers.end()) {
            found->second(node, prefix + name);
            continue;
        }
        std::string list;
        for (auto const& [known, taker] : takers) {
            list += (list.empty() ? "" : ", ") + known;
        }
        mistake(node, prefix + name, "is not known here; " + list + " are");
    }
}

SettingsTable::Taker SettingsTable::volts(double& target, double lowest)
{
    return [this, &target, lowest](toml::node const& node, std::string const& key) {
        std::optional<double> const value = node.value<double>();
        if (value && *value >= lowest && *value <= highestVolts) {
            target = *value;
        } else {
            mistake(node, key,
                    fmt::format("must be a number of volts from {} to {}, of a 12 V system", lowest, highestVolts));
        }
    };
}

} // namespace velmora
