#include "libvelmora/http/httpserver.h"
#include "libvelmora/longwatch/watchorder.h"
#include "libvelmora/longwatch/watchrun.h"

#include <velmora/error.h>

#include <utility>

namespace velmora {

struct LongWatch::Parts
{
    explicit Parts(LongWatchOptions given) : options(std::move(given)), settings(settingsOf(options)) {}

    void runOnce();
    void forget();
    void readAgain();
    // Ends the run under way, so that the next one has what was changed.
    void endRun();

    LongWatchOptions const options;
    WatchSettings settings;
    ServiceNotify notify;
    std::atomic<bool> ended{false};
    std::atomic<bool> changed{false}; // the settings are to be read again
    mutable std::mutex mutex;
    std::unique_ptr<WatchRun> run; // protected by mutex
    Health lastHealth;             // protected by mutex
};

void LongWatch::Parts::runOnce()
{
    auto made = std::make_unique<WatchRun>(options, settings, notify);
    WatchRun& now = *made;
    {
        std::lock_guard const lock(mutex);
        run = std::move(made);
    }
    try {
        if (!ended && !changed) {
            now.run();
        }
        now.finish();
    } catch (...) {
        now.finish();
        forget();
        throw;
    }
    forget();
}

void LongWatch::Parts::forget()
{
    std::lock_guard const lock(mutex);
    lastHealth = run->health();
    run.reset();
}

void LongWatch::Parts::endRun()
{
    std::lock_guard const lock(mutex);
    if (run != nullptr) {
        run->end();
    }
}

// Settings that make no sense leave the old ones in force.
void LongWatch::Parts::readAgain()
{
    notify.tell("RELOADING=1");
    std::string text = "The settings were read again";
    try {
        settings = settingsOf(options);
    } catch (Error const& error) {
        text = std::string("The settings stay as they were: ") + error.what();
    }
    if (options.onReload) {
        options.onReload(text);
    }
}

LongWatch::LongWatch(LongWatchOptions options) : m_parts(std::make_unique<Parts>(std::move(options))) {}

LongWatch::~LongWatch() = default;

void LongWatch::run()
{
    while (!m_parts->ended) {
        m_parts->runOnce();
        if (m_parts->changed.exchange(false)) {
            m_parts->readAgain();
        }
    }
    m_parts->notify.tell("STOPPING=1");
}

void LongWatch::end()
{
    m_parts->ended = true;
    m_parts->endRun();
}

void LongWatch::reload()
{
    m_parts->changed = true;
    m_parts->endRun();
}

bool LongWatch::abandon()
{
    std::lock_guard const lock(m_parts->mutex);
    bool const mine = m_parts->run == nullptr || m_parts->run->endOutputs();
    if (mine) {
        m_parts->notify.tell("STOPPING=1");
    }
    return mine;
}

Health LongWatch::health() const
{
    std::lock_guard const lock(m_parts->mutex);
    return m_parts->run != nullptr ? m_parts->run->health() : m_parts->lastHealth;
}

void checkPagePlace(std::string const& place)
{
    parseHttpPlace(place);
}

} // namespace velmora
