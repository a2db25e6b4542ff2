#include "libvelmora/channel/learntstore.h"

#include "libvelmora/channel/busline.h"
#include "libvelmora/text/toml.h"

#include <fstream>
#include <system_error>
#include <utility>

namespace velmora {

namespace {

// The file holds some hundred requests of some vehicles; a larger one is not ours.
constexpr std::uintmax_t largestFile = 1U << 20U;

// "2024:2 2025:1", modules in decimal: keys of a table would sort and quote otherwise.
std::string frameText(FrameSet const& frames)
{
    std::string text;
    for (auto const& [module, count] : frames) {
        text += (text.empty() ? "" : " ") + std::to_string(module) + ":" + std::to_string(count);
    }
    return text;
}

// More than ATST takes is none of ours.
LearntWait readWait(toml::node_view<toml::node const> const& entry)
{
    auto const steps = entry["wait"].value_or<std::int64_t>(0);
    return {steps > 0 && steps <= 0xFF ? static_cast<unsigned int>(steps) : 0, entry["cut"].value_or(false)};
}

// Nothing for a text that is none of ours.
FrameSet readFrameText(std::string const& text)
{
    FrameSet frames;
    std::istringstream in(text);
    unsigned int module = 0;
    unsigned int count = 0;
    char colon = 0;
    while (in >> module >> colon >> count) {
        frames[module] = count;
    }
    return in.eof() ? frames : FrameSet();
}

} // namespace

LearntStore::LearntStore(std::filesystem::path file) : m_file(std::move(file))
{
    load();
}

void LearntStore::load()
{
    std::error_code error;
    if (!std::filesystem::is_regular_file(m_file, error) || std::filesystem::file_size(m_file, error) > largestFile) {
        return;
    }
    try {
        toml::table const root = toml::parse_file(m_file.string());
        for (auto const& [name, node] : root["adapter"].is_table() ? *root["adapter"].as_table() : toml::table()) {
            toml::node_view<toml::node const> const entry(node);
            int const protocol = entry["protocol"].value_or(0);
            m_adapters[std::string(name.str())] = {busKindOf(protocol) != BusKind::Unknown ? protocol : 0,
                                                   entry["counts"].value_or(true), readWait(entry)};
        }
        for (auto const& [vin, node] : root["vehicle"].is_table() ? *root["vehicle"].as_table() : toml::table()) {
            for (auto const& [request, frames] : node.is_table() ? *node.as_table() : toml::table()) {
                FrameSet const set = readFrameText(frames.value_or<std::string>(""));
                if (!set.empty()) {
                    m_vehicles[std::string(vin.str())][std::string(request.str())] = set;
                }
            }
        }
    } catch (toml::parse_error const&) {
        return; // before anything was taken
    }
}

int LearntStore::protocol(std::string const& adapter) const
{
    std::lock_guard const lock(m_mutex);
    auto const found = m_adapters.find(adapter);
    return found != m_adapters.end() ? found->second.protocol : 0;
}

void LearntStore::setProtocol(std::string const& adapter, int protocol)
{
    std::lock_guard const lock(m_mutex);
    m_adapters[adapter].protocol = protocol;
}

bool LearntStore::canCount(std::string const& adapter) const
{
    std::lock_guard const lock(m_mutex);
    auto const found = m_adapters.find(adapter);
    return found == m_adapters.end() || found->second.canCount;
}

void LearntStore::setCanCount(std::string const& adapter, bool can)
{
    std::lock_guard const lock(m_mutex);
    m_adapters[adapter].canCount = can;
}

LearntWait LearntStore::wait(std::string const& adapter) const
{
    std::lock_guard const lock(m_mutex);
    auto const found = m_adapters.find(adapter);
    return found != m_adapters.end() ? found->second.wait : LearntWait();
}

void LearntStore::setWait(std::string const& adapter, LearntWait const& wait)
{
    std::lock_guard const lock(m_mutex);
    m_adapters[adapter].wait = wait;
}

std::map<std::string, FrameSet> LearntStore::counts(std::string const& vin) const
{
    std::lock_guard const lock(m_mutex);
    auto const found = m_vehicles.find(vin);
    return found != m_vehicles.end() ? found->second : std::map<std::string, FrameSet>();
}

void LearntStore::setCounts(std::string const& vin, std::map<std::string, FrameSet> const& counts)
{
    std::lock_guard const lock(m_mutex);
    m_vehicles[vin] = counts;
}

void LearntStore::save() const
{
    std::lock_guard const lock(m_mutex);
    if (m_file.empty()) {
        return;
    }
    toml::table adapters;
    for (auto const& [name, adapter] : m_adapters) {
        toml::table entry{{"protocol", adapter.protocol}, {"counts", adapter.canCount}};
        if (adapter.wait.steps != 0) {
            entry.insert("wait", adapter.wait.steps);
            entry.insert("cut", adapter.wait.isCut);
        }
        adapters.insert(name, std::move(entry));
    }
    toml::table vehicles;
    for (auto const& [vin, counts] : m_vehicles) {
        toml::table requests;
        for (auto const& [request, frames] : counts) {
            requests.insert(request, frameText(frames));
        }
        vehicles.insert(vin, std::move(requests));
    }
    std::error_code ignored;
    std::filesystem::create_directories(m_file.parent_path(), ignored);
    std::filesystem::path const temporary = m_file.string() + ".new";
    std::ofstream out(temporary);
    out << toml::table{{"adapter", std::move(adapters)}, {"vehicle", std::move(vehicles)}} << "\n";
    out.close();
    if (out) {
        std::filesystem::rename(temporary, m_file, ignored);
    } else {
        std::filesystem::remove(temporary, ignored);
    }
}

void LearntStore::forget()
{
    std::lock_guard const lock(m_mutex);
    m_adapters.clear();
    m_vehicles.clear();
    std::error_code ignored;
    std::filesystem::remove(m_file, ignored);
}

std::filesystem::path LearntStore::besides(std::filesystem::path const& settings)
{
    return settings.parent_path() / "learnt.toml";
}

} // namespace velmora
