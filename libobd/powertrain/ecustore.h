#pragma once

#include <obd/iecu.h>

#include <map>
#include <mutex>
#include <optional>

namespace obd {

// What was decoded last from each control module. Guarded: the worker stores while the application reads.
template <typename T>
class EcuStore
{
public:
    void put(IEcu const& ecu, T const& value)
    {
        std::lock_guard const lock(m_mutex);
        m_values[ecu.id()] = value;
    }

    // Nothing for a module that has not answered.
    std::optional<T> get(IEcu const& ecu) const
    {
        std::lock_guard const lock(m_mutex);
        auto const found = m_values.find(ecu.id());
        return found == m_values.end() ? std::nullopt : std::optional<T>(found->second);
    }

    void clear()
    {
        std::lock_guard const lock(m_mutex);
        m_values.clear();
    }

private:
    mutable std::mutex m_mutex;
    std::map<unsigned int, T> m_values;
};

} // namespace obd
