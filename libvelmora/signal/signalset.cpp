#include "libvelmora/signal/signalset.h"

#include "common/text/text.h"
#include "libvelmora/signal/signalfile.h"

#include <velmora/error.h>

#include <fmt/format.h>

#include <algorithm>
#include <sstream>

namespace velmora {

namespace {

std::vector<std::filesystem::path> filesIn(std::filesystem::path const& folder)
{
    std::vector<std::filesystem::path> files;
    std::error_code ignored;
    for (auto const& each : std::filesystem::directory_iterator(folder, ignored)) {
        if (each.path().extension() == ".toml") {
            files.push_back(each.path());
        }
    }
    std::sort(files.begin(), files.end());
    return files;
}

// "A6" of "01A6", "0xA6", "$A6" and "a6".
std::string pidOf(std::string word)
{
    word = toUpper(word);
    for (char const* const lead : {"$", "0X"}) {
        if (word.starts_with(lead)) {
            word.erase(0, std::string(lead).size());
        }
    }
    return word.size() == 4 && word.starts_with("01") ? word.substr(2) : word;
}

// Goes back to the last * only, so that no pattern costs more than its length times that of the text.
bool matchesPattern(std::string_view pattern, std::string_view text)
{
    std::size_t at = 0;
    std::size_t star = std::string_view::npos;
    std::size_t resume = 0;
    for (std::size_t i = 0; i < text.size();) {
        if (at < pattern.size() && (pattern[at] == '?' || pattern[at] == text[i])) {
            ++at;
            ++i;
        } else if (at < pattern.size() && pattern[at] == '*') {
            star = at++;
            resume = i;
        } else if (star != std::string_view::npos) {
            at = star + 1;
            i = ++resume;
        } else {
            return false;
        }
    }
    return pattern.find_first_not_of('*', at) == std::string_view::npos;
}

} // namespace

SignalSet::SignalSet()
{
    addBuiltIns();
}

SignalSet::SignalSet(std::vector<std::string> const& files, std::filesystem::path const& folder,
                     std::function<void(std::string const&)> const& tell)
{
    for (std::string const& file : files) {
        add(loadSignalFile(file));
    }
    for (std::filesystem::path const& file : filesIn(folder)) {
        try {
            add(loadSignalFile(file.string()));
        } catch (Error const& error) {
            if (tell) {
                std::string const why = error.hints().empty() ? "" : "  - " + error.hints().front() + "\n";
                tell(fmt::format("{} is passed over: {}\n{}", file.string(), error.what(), why));
            }
        }
    }
    addBuiltIns();
}

void SignalSet::add(SignalFile const& file)
{
    for (Signal const& signal : file.signals) {
        std::size_t const index = m_entries.size();
        m_byId.emplace(toUpper(signal.id), index);
        m_byName.emplace(toUpper(signal.name), index);
        m_byFile[file.path].emplace(signal.id, index);
        m_entries.push_back({.signal = signal,
                             .path = file.path,
                             .vin = file.vin,
                             .length = signal.length.value_or(0),
                             .supported = {},
                             .standing = PidStanding::Recorded});
    }
}

void SignalSet::addBuiltIns()
{
    for (BuiltinPid const& each : builtinPids()) {
        std::size_t const index = m_entries.size();
        m_byId.emplace(each.signal.id, index);
        m_byName.emplace(toUpper(each.signal.name), index);
        m_entries.push_back({.signal = each.signal,
                             .path = {},
                             .vin = {},
                             .length = each.length,
                             .supported = each.supported,
                             .standing = each.standing});
        if (each.standing == PidStanding::Listed) {
            m_entries.back().signal.name += " (one source)";
        }
    }
}

std::vector<std::size_t> SignalSet::find(std::string const& word) const
{
    std::string const wanted = toUpper(word);
    for (auto const* const names : {&m_byId, &m_byName}) {
        if (auto const found = names->find(wanted); found != names->end()) {
            return {found->second};
        }
    }
    std::vector<std::size_t> found;
    std::string const pid = pidOf(word);
    for (std::size_t i = 0; i < m_entries.size() && pid.size() == 2; ++i) {
        if (m_entries[i].isBuiltIn() && fmt::format("{:02X}", m_entries[i].signal.request[1]) == pid) {
            found.push_back(i);
        }
    }
    return found;
}

std::vector<std::size_t> SignalSet::search(std::string const& words) const
{
    std::vector<std::size_t> found;
    for (std::size_t i = 0; i < m_entries.size(); ++i) {
        std::string const name = toUpper(m_entries[i].signal.name);
        std::istringstream list(toUpper(words));
        bool all = !m_entries[i].isBuiltIn();
        for (std::string word; all && list >> word;) {
            all = name.find(word) != std::string::npos;
        }
        if (all) {
            found.push_back(i);
        }
    }
    return found;
}

std::optional<std::size_t> SignalSet::sibling(std::size_t index, std::string const& id) const
{
    auto const file = m_byFile.find(m_entries[index].path);
    if (file == m_byFile.end()) {
        return std::nullopt;
    }
    auto const found = file->second.find(id);
    return found != file->second.end() ? std::optional(found->second) : std::nullopt;
}

std::filesystem::path SignalSet::folderBesides(std::filesystem::path const& settings)
{
    return settings.parent_path() / "signals";
}

int signalId(std::size_t index)
{
    return firstSignalId + static_cast<int>(index);
}

bool fitsVin(std::string const& pattern, std::string const& vin)
{
    return pattern.empty() || matchesPattern(toUpper(pattern), toUpper(vin));
}

} // namespace velmora
