#include "libvelmora/session/settingsstore.h"

#include "libvelmora/record/checkedfile.h"
#include "libvelmora/session/vehiclesettings.h"
#include "libvelmora/text/toml.h"

#include <velmora/error.h>

#include <cerrno>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <sstream>
#include <unistd.h>
#include <utility>

namespace velmora {

namespace {

constexpr std::uintmax_t largestFile = 1 << 20;

[[noreturn]] void failRead(std::filesystem::path const& file, std::string const& why)
{
    throw Error(ErrorKind::Failed, "Could not read the settings file " + file.string() + ": " + why,
                {"mend the file, or move it away to start with the defaults", "--settings FILE names another"});
}

[[noreturn]] void failWrite(std::filesystem::path const& file, int error)
{
    throw Error(ErrorKind::Failed, "Could not write the settings file " + file.string() + ": " + std::strerror(error),
                {"is there room on the disk, and may you write there? the old file is untouched",
                 "--settings FILE names another"});
}

template <typename Visit>
void visitLeaves(toml::table const& table, std::string const& prefix, Visit visit)
{
    for (auto const& [key, node] : table) {
        std::string const path = prefix + std::string(key.str());
        if (toml::table const* inner = node.as_table()) {
            visitLeaves(*inner, path + "/", visit);
        } else {
            visit(path, node);
        }
    }
}

// The number of the error, or 0.
int writeAll(int file, std::string const& text)
{
    std::size_t written = 0;
    while (written < text.size()) {
        ssize_t const count = ::write(file, text.data() + written, text.size() - written);
        if (count < 0 && errno != EINTR) {
            return errno;
        }
        written += count > 0 ? static_cast<std::size_t>(count) : 0;
    }
    return ::fsync(file) != 0 ? errno : 0;
}

// Makes sure that the new name, too, outlives a loss of power.
void syncFolder(std::filesystem::path const& target)
{
    std::filesystem::path const folder = target.has_parent_path() ? target.parent_path() : ".";
    int const handle = ::open(folder.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (handle >= 0) {
        ::fsync(handle);
        ::close(handle);
    }
}

// Whoever reads the file, and whenever the process ends, finds the old content or the new. Each writer has a temporary
// file of its own.
void writeWhole(std::filesystem::path const& target, std::string const& text)
{
    std::string temporary = target.string() + ".XXXXXX";
    int const file = ::mkostemp(temporary.data(), O_CLOEXEC);
    if (file < 0) {
        failWrite(target, errno);
    }
    int error = writeAll(file, text);
    ::close(file);
    if (error == 0 && std::rename(temporary.c_str(), target.c_str()) != 0) {
        error = errno;
    }
    if (error != 0) {
        ::unlink(temporary.c_str());
        failWrite(target, error);
    }
    syncFolder(target);
}

// A value that a user wrote in the place of a group gives way to it.
toml::table& groupIn(toml::table& table, std::string const& name)
{
    if (!table[name].is_table()) {
        table.insert_or_assign(name, toml::table{});
    }
    return *table[name].as_table();
}

} // namespace

SettingsStore::SettingsStore(std::filesystem::path file) : m_file(std::move(file))
{
    std::error_code error;
    if (!std::filesystem::exists(m_file, error)) {
        return;
    }
    if (std::string const why = whyUnreadable(m_file, largestFile); !why.empty()) {
        failRead(m_file, why);
    }
    try {
        visitLeaves(toml::parse_file(m_file.string()), {}, [this](std::string const& key, toml::node const& node) {
            if (auto const number = node.value_exact<std::int64_t>()) {
                if (!std::in_range<int>(*number)) {
                    failRead(m_file, key + " is too large a number");
                }
                m_values[key] = static_cast<int>(*number);
            } else if (auto const text = node.value_exact<std::string>()) {
                m_values[key] = *text;
            } else if (int stored = 0; storedHundredths(key, node.value_exact<double>().value_or(NAN), stored)) {
                m_values[key] = stored;
            } else {
                failRead(m_file, key + " is neither a whole number nor a text");
            }
        });
    } catch (toml::parse_error const& problem) {
        std::ostringstream place;
        place << problem.description() << " (line " << problem.source().begin.line << ")";
        failRead(m_file, place.str());
    }
    refuseWrongValues();
}

// A value that nobody can set would count all the same, and bring plausible wrong numbers.
void SettingsStore::refuseWrongValues() const
{
    for (VehicleSetting const& setting : vehicleSettings()) {
        auto const found = m_values.find(setting.key);
        if (found == m_values.end()) {
            continue;
        }
        int const* const number = std::get_if<int>(&found->second);
        if (number == nullptr || *number < setting.lowest || *number > setting.highest) {
            failRead(m_file, found->first + " has no value that it can have; expected " + storedRange(setting));
        }
    }
}

void SettingsStore::setInt(std::string const& key, int value)
{
    std::lock_guard const lock(m_mutex);
    m_values[key] = value;
}

void SettingsStore::setString(std::string const& key, std::string const& value)
{
    std::lock_guard const lock(m_mutex);
    m_values[key] = value;
}

template <typename T>
bool SettingsStore::get(std::string const& key, T& value)
{
    std::lock_guard const lock(m_mutex);
    auto const found = m_values.find(key);
    if (found == m_values.end() || !std::holds_alternative<T>(found->second)) {
        return false;
    }
    value = std::get<T>(found->second);
    return true;
}

void SettingsStore::remove(std::string const& key)
{
    std::lock_guard const lock(m_mutex);
    m_values.erase(key);
}

bool SettingsStore::getInt(std::string const& key, int& value)
{
    return get(key, value);
}

bool SettingsStore::getString(std::string const& key, std::string& value)
{
    return get(key, value);
}

std::vector<std::string> SettingsStore::keysBelow(std::string const& beginning)
{
    std::lock_guard const lock(m_mutex);
    std::vector<std::string> keys;
    for (auto each = m_values.lower_bound(beginning); each != m_values.end() && each->first.starts_with(beginning);
         ++each) {
        keys.push_back(each->first.substr(beginning.size()));
    }
    return keys;
}

std::string SettingsStore::toToml() const
{
    toml::table root;
    for (auto const& [key, value] : m_values) {
        toml::table* table = &root;
        std::size_t begin = 0;
        for (std::size_t slash = key.find('/'); slash != std::string::npos; slash = key.find('/', begin)) {
            table = &groupIn(*table, key.substr(begin, slash - begin));
            begin = slash + 1;
        }
        std::string const name = key.substr(begin);
        std::visit([&](auto const& plain) { table->insert_or_assign(name, plain); }, value);
    }
    std::ostringstream text;
    text << root << "\n";
    return text.str();
}

void SettingsStore::sync()
{
    std::lock_guard const lock(m_mutex);
    std::error_code error;
    if (m_file.has_parent_path()) {
        std::filesystem::create_directories(m_file.parent_path(), error);
    }
    if (error) {
        failWrite(m_file, error.value());
    }
    writeWhole(m_file, toToml());
}

std::filesystem::path SettingsStore::defaultFile()
{
    char const* const configured = std::getenv("XDG_CONFIG_HOME");
    char const* const home = std::getenv("HOME");
    std::filesystem::path const folder = configured != nullptr && *configured != '\0'
                                             ? std::filesystem::path(configured)
                                             : std::filesystem::path(home != nullptr ? home : ".") / ".config";
    return folder / "velmora" / "settings.toml";
}

} // namespace velmora
