#pragma once

#include "libvelmora/longwatch/watchpage.h"
#include "libvelmora/output/outputrunner.h"
#include "libvelmora/watch/servicenotify.h"
#include "libvelmora/watch/watchsettings.h"

#include <atomic>
#include <mutex>

namespace velmora {

// One run of the watch with one set of settings: the car, the engine, and the outputs.
class WatchRun
{
public:
    // Opens the outputs. Throws Error for settings that make no sense. options and notify must outlive it.
    WatchRun(LongWatchOptions const& options, WatchSettings const& settings, ServiceNotify& notify);
    ~WatchRun();
    WatchRun(WatchRun const&) = delete;
    WatchRun& operator=(WatchRun const&) = delete;

    // Until end is called, or another vehicle than the one that the outputs are named after answers. Throws Error for
    // what trying again can't mend.
    void run();
    // Any thread.
    void end();
    // Ends the trip under way and flushes the outputs.
    void finish();
    // The last part of it: flushes the outputs, and waits only for those that don't hang. Any thread, at most one that
    // does it: false for the others.
    bool endOutputs();
    // Any thread.
    Health health() const;

private:
    struct HealthBoard
    {
        std::mutex mutex;
        Health health; // protected by mutex
    };

    void addOutputs(WatchSettings const& settings);
    void take(Record record);
    void tellState();
    void takeHealth();
    void say(std::string const& text) const;

    LongWatchOptions const& m_options;
    ServiceNotify& m_notify;
    std::string const m_vehicle;
    WatchPage m_page;
    SessionCar m_car;
    std::shared_ptr<HealthBoard> const m_health = std::make_shared<HealthBoard>(); // shared with the outputs
    std::vector<std::unique_ptr<OutputRunner>> m_outputs;
    std::unique_ptr<WatchEngine> m_engine;
    std::string m_toldState;
    std::atomic<bool> m_end{false};
    std::atomic<bool> m_outputsEnded{false};
    bool m_finished = false;
};

} // namespace velmora
