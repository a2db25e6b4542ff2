#pragma once

#include <cstddef>
#include <deque>
#include <memory>
#include <mutex>
#include <optional>

namespace obd {

class IDispatchable;

// Work in the order of its arrival. Weak references: the queue keeps no work alive. Safe from any thread; the lock is
// held for the push or the pop alone.
class DispatchQueue
{
public:
    void push(std::weak_ptr<IDispatchable> const& work);

    // The oldest entry; nothing if the queue is empty.
    std::optional<std::weak_ptr<IDispatchable>> pop();

    std::size_t size() const;
    void clear();

private:
    mutable std::mutex m_mutex;
    std::deque<std::weak_ptr<IDispatchable>> m_entries; // protected by m_mutex
};

} // namespace obd
