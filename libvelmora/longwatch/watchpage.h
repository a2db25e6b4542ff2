#pragma once

#include "libvelmora/output/health.h"
#include "libvelmora/output/ioutput.h"
#include "libvelmora/output/outputaddress.h"
#include "libvelmora/watch/sessioncar.h"
#include "libvelmora/watch/watchengine.h"

#include <velmora/longwatch.h>

#include <filesystem>

namespace velmora {

// What joins the page in the browser to a watch. In a build without it, the same that knows of no page.
class WatchPage
{
public:
    static constexpr std::chrono::milliseconds interval{100}; // between two events of the page

    // options: whether the page is what the watch is for, and who is told where it is.
    WatchPage(std::vector<OutputAddress> const& outputs, std::string vehicle, LongWatchOptions const& options);
    ~WatchPage();
    WatchPage(WatchPage const&) = delete;
    WatchPage& operator=(WatchPage const&) = delete;

    static bool is(OutputAddress const& address) { return address.kind == "dash"; }

    // The options of a car that the page hears at once.
    SessionCarOptions withTaps(SessionCarOptions options) const;
    // Throws Error for settings that make no sense, and in a build without the page.
    std::unique_ptr<IOutput> makeOutput(OutputAddress const& address, HealthSource health,
                                        std::filesystem::path const& settings) const;
    // Does what browsers ask for. The watch's thread, between two steps.
    void serve(SessionCar& car, WatchEngine& engine, WatchEngine::Sink const& sink);

private:
    struct Parts;
    struct Service;
    std::shared_ptr<Parts> m_parts; // null where there is no page; an output that hangs may outlive this object
    std::unique_ptr<Service> m_service;
};

} // namespace velmora
