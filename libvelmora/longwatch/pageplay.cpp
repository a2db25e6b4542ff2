#include "libvelmora/dash/dashoutput.h"
#include "libvelmora/dash/playdesk.h"
#include "libvelmora/session/settingsstore.h"

#include <velmora/recording.h>

#include <chrono>
#include <condition_variable>
#include <mutex>
#include <utility>

namespace velmora {

namespace {

constexpr std::chrono::milliseconds pageStep{100};

DashContext playedPage(std::string const& settingsFile, PlayDesk& desk,
                       std::function<void(std::string const& link, std::string const& remark)> onLink)
{
    DashContext context;
    context.desk = desk.desk();
    context.health = [] {
        Health health;
        health.linkUp = true;
        health.state = "playing";
        return health;
    };
    context.playState = [&desk] { return desk.state(); };
    context.settings = settingsFile.empty() ? SettingsStore::defaultFile() : std::filesystem::path(settingsFile);
    context.layouts = DashLayouts::besides(context.settings);
    context.mustListen = true;
    if (onLink) {
        context.onLink = std::move(onLink);
    }
    return context;
}

} // namespace

struct PagePlay::Parts
{
    Parts(Recording played, double speed) : recording(std::move(played)), desk(recording, speed) {}

    Recording const recording;
    PlayDesk desk;
    std::unique_ptr<DashOutput> page; // goes before the desk
    std::mutex mutex;
    std::condition_variable wake;
    bool ended = false; // protected by mutex
};

PagePlay::PagePlay(Recording recording, std::string const& address, double speed, std::string const& settingsFile,
                   std::function<void(std::string const& link, std::string const& remark)> onLink)
    : m_parts(std::make_unique<Parts>(std::move(recording), speed))
{
    m_parts->page = std::make_unique<DashOutput>(parseOutputAddress(address),
                                                 playedPage(settingsFile, m_parts->desk, std::move(onLink)));
}

PagePlay::~PagePlay() = default;

void PagePlay::run()
{
    m_parts->page->open();
    m_parts->desk.introduce();
    auto last = std::chrono::steady_clock::now();
    std::unique_lock lock(m_parts->mutex);
    while (!m_parts->ended) {
        lock.unlock();
        auto const now = std::chrono::steady_clock::now();
        m_parts->desk.step(std::chrono::duration<double>(now - last).count());
        last = now;
        m_parts->page->write({});
        lock.lock();
        m_parts->wake.wait_for(lock, pageStep, [this] { return m_parts->ended; });
    }
    lock.unlock();
    m_parts->page->close();
}

void PagePlay::end()
{
    std::lock_guard const lock(m_parts->mutex);
    m_parts->ended = true;
    m_parts->wake.notify_all();
}

} // namespace velmora
