#pragma once

#include <obd/isettings.h>

#include <map>
#include <mutex>
#include <stdexcept>
#include <string>
#include <vector>

namespace support {

// A settings store in memory that remembers what was asked of it, and that can fail. Safe from any thread.
class MemorySettings : public obd::ISettings
{
public:
    MemorySettings() = default;
    MemorySettings(std::map<std::string, int> ints, std::map<std::string, std::string> strings = {})
        : m_ints(std::move(ints)), m_strings(std::move(strings))
    {}

    void setInt(std::string const& key, int value) override
    {
        std::lock_guard const lock(m_mutex);
        beginWrite(key, std::to_string(value));
        m_ints[key] = value;
    }

    void setString(std::string const& key, std::string const& value) override
    {
        std::lock_guard const lock(m_mutex);
        beginWrite(key, value);
        m_strings[key] = value;
    }

    bool getInt(std::string const& key, int& value) override { return read(m_ints, key, value); }
    bool getString(std::string const& key, std::string& value) override { return read(m_strings, key, value); }

    void sync() override
    {
        std::lock_guard const lock(m_mutex);
        ++m_syncs;
    }

    // While set, no key has a value.
    void failReads(bool fail)
    {
        std::lock_guard const lock(m_mutex);
        m_failReads = fail;
    }

    // While set, a write throws std::runtime_error and stores nothing.
    void failWrites(bool fail)
    {
        std::lock_guard const lock(m_mutex);
        m_failWrites = fail;
    }

    void erase(std::string const& key)
    {
        std::lock_guard const lock(m_mutex);
        m_ints.erase(key);
        m_strings.erase(key);
    }

    // All writes so far in their order, as "key=value".
    std::vector<std::string> writes() const
    {
        std::lock_guard const lock(m_mutex);
        return m_writes;
    }

    void forgetWrites()
    {
        std::lock_guard const lock(m_mutex);
        m_writes.clear();
    }

    int syncs() const
    {
        std::lock_guard const lock(m_mutex);
        return m_syncs;
    }

private:
    void beginWrite(std::string const& key, std::string const& value)
    {
        if (m_failWrites) {
            throw std::runtime_error("the store is full");
        }
        m_writes.push_back(key + "=" + value);
    }

    template <typename T>
    bool read(std::map<std::string, T> const& values, std::string const& key, T& value) const
    {
        std::lock_guard const lock(m_mutex);
        auto const entry = values.find(key);
        if (m_failReads || entry == values.end()) {
            return false;
        }
        value = entry->second;
        return true;
    }

    mutable std::mutex m_mutex;
    std::map<std::string, int> m_ints;
    std::map<std::string, std::string> m_strings;
    std::vector<std::string> m_writes;
    bool m_failReads = false;
    bool m_failWrites = false;
    int m_syncs = 0;
};

} // namespace support
