#include "libvelmora/signal/signalreferences.h"

#include <string_view>
#include <unordered_map>

namespace velmora {

namespace {

// How many signals each one still waits for, and who waits for it.
struct References
{
    std::vector<std::size_t> open;
    std::vector<std::vector<std::size_t>> readers;
};

References referencesOf(std::vector<Signal> const& signals)
{
    std::unordered_map<std::string_view, std::size_t> indexes;
    for (std::size_t i = 0; i < signals.size(); ++i) {
        indexes.emplace(signals[i].id, i);
    }
    References references{std::vector<std::size_t>(signals.size(), 0),
                          std::vector<std::vector<std::size_t>>(signals.size())};
    for (std::size_t i = 0; i < signals.size(); ++i) {
        if (!signals[i].formula) {
            continue;
        }
        for (std::string const& name : valuesReadBy(*signals[i].formula)) {
            ++references.open[i];
            if (auto const other = indexes.find(name); other != indexes.end() && signals[other->second].formula) {
                references.readers[other->second].push_back(i);
            }
        }
    }
    return references;
}

} // namespace

// From those that read nothing to their readers and on: what is never reached waits for something missing or for
// itself.
std::vector<std::size_t> brokenReferences(std::vector<Signal> const& signals)
{
    References references = referencesOf(signals);
    std::vector<std::size_t> known;
    for (std::size_t i = 0; i < signals.size(); ++i) {
        if (references.open[i] == 0) {
            known.push_back(i);
        }
    }
    for (std::size_t at = 0; at < known.size(); ++at) {
        for (std::size_t const reader : references.readers[known[at]]) {
            if (--references.open[reader] == 0) {
                known.push_back(reader);
            }
        }
    }
    std::vector<std::size_t> broken;
    for (std::size_t i = 0; i < signals.size(); ++i) {
        if (references.open[i] != 0) {
            broken.push_back(i);
        }
    }
    return broken;
}

} // namespace velmora
