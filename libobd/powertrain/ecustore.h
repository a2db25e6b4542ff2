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

// What the parameters of one class have gathered from each control module, over all objects of the class: they come and
// go with the selection of sensors, and a smoothed value should not start again each time. Stays until cleared, also
// when the vehicle changes. Guarded: the worker feeds while the application reads.
template <typename Data>
class EcuHistory
{
public:
    // Calls change with the module's data, which is made if there is none.
    template <typename Change>
    void change(IEcu const& ecu, Change const& change)
    {
        std::lock_guard const lock(m_mutex);
        change(m_data[ecu.id()]);
    }

    // What read makes of the module's data; 0.0 if there is none.
    template <typename Read>
    double read(IEcu const& ecu, Read const& read) const
    {
        std::lock_guard const lock(m_mutex);
        auto const found = m_data.find(ecu.id());
        return found != m_data.end() ? read(found->second) : 0.0;
    }

    void clear()
    {
        std::lock_guard const lock(m_mutex);
        m_data.clear();
    }

private:
    mutable std::mutex m_mutex;
    std::map<unsigned int, Data> m_data; // by module id
};

} // namespace obd
