#pragma once

#include "libvelmora/performance/performancemeter.h"
#include "libvelmora/performance/powermodel.h"
#include "libvelmora/report/json.h"

#include <memory>
#include <mutex>

namespace velmora {

// Timed runs that one thread begins and ends, another feeds, and any looks at.
class RunBoard
{
public:
    // Forgets what was before. Readings of that module alone count from now on.
    void begin(std::shared_ptr<obd::IEcu> const& module, obd::IVelmoraSettings const& settings);
    // What came of it stays to be looked at.
    void end();

    void take(Reading const& reading);

    bool isActive() const;
    // What people look at, or all of it with each point of the speed; null before the first begin.
    Json state(bool whole) const;
    // Whether anything has changed since the last call.
    bool takeChange();

private:
    mutable std::mutex m_mutex; // protects all below
    unsigned int m_module = 0;
    int m_kilograms = 0;
    bool m_begun = false;
    bool m_changed = false;
    std::unique_ptr<PowerModel> m_model; // null while nothing is timed
    PerformanceMeter m_meter;
};

} // namespace velmora
