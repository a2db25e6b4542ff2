#pragma once

#include "libvelmora/output/record.h"
#include "libvelmora/performance/runboard.h"
#include "libvelmora/report/json.h"

#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace velmora {

// Something that a browser wants of the car.
struct DashAsk
{
    std::string topic; // "codes", "readiness", "monitors", "info", "clear", "console", "sensors", "performance", "play"
    std::string text;  // of console the command, of sensors the wishes, a line each, of performance "begin" or "end",
                       // of play what PlayDesk::parse gives
};

// What came of it.
struct DashAnswer
{
    std::string topic;
    bool done = true; // false: data is a text that tells why not
    Json data;
};

// The vehicle whose values come from now on.
struct DashVehicle
{
    std::string key;                  // what its layout is kept under
    std::vector<SensorEntry> offered; // all that can be chosen
};

// A line of the traffic with the adapter.
struct DashLine
{
    WallTime time;
    bool sent = false;
    std::string text;
};

// Stands between the pages' server and the car, which belong to different threads: hands over wishes one way, values
// and answers the other. Any thread.
class DashDesk
{
public:
    // Who shows what the car tells. Called from any thread, one call at a time.
    struct Listener
    {
        std::function<void(Reading const&)> reading;
        std::function<void(DashLine const&)> line;
        std::function<void(DashAnswer const&)> answer;
        std::function<void(DashVehicle const&)> vehicle;
    };

    // From then on until the token goes, which the desk must outlive.
    std::shared_ptr<void> listen(Listener listener);

    // False if too many wishes wait already. One that waits in the same words is not taken twice.
    bool ask(DashAsk ask);
    std::optional<DashAsk> next();
    // The runs that are timed. They are fed by tell.
    RunBoard& runs() { return m_runs; }

    // No wish is of use any more, as the vehicle is gone.
    void drop();

    void tell(Reading const& reading);
    void tell(DashLine const& line);
    void tell(DashAnswer const& answer);
    void tell(DashVehicle const& vehicle);

private:
    template <typename Member, typename Value>
    void hand(Member member, Value const& value);

    RunBoard m_runs;
    std::mutex m_asksMutex;
    std::deque<DashAsk> m_asks; // protected by m_asksMutex
    std::mutex m_listenersMutex;
    std::vector<std::unique_ptr<Listener>> m_listeners; // protected by m_listenersMutex
};

} // namespace velmora
