#pragma once

#include "libvelmora/poll/addresstrial.h"
#include "libvelmora/poll/deadlinescheduler.h"
#include "libvelmora/poll/ipollguest.h"
#include "libvelmora/poll/polledparameter.h"
#include "libvelmora/poll/pollpace.h"
#include "libvelmora/poll/pollplan.h"

#include <functional>
#include <map>
#include <memory>
#include <mutex>
#include <optional>
#include <set>
#include <utility>
#include <vector>

namespace velmora {

// What a sensor was to be read at, and what came of it.
struct PollRate
{
    unsigned int module = 0;
    int pid = 0;                 // or the id of a guest's value
    std::optional<double> asked; // hertz
    double reached = 0.0;        // hertz, of late
    int silent = 0;              // turns in a row that brought no value
    std::string sensor{};        // the key of a guest's value; empty for a PID
};

// One parameter to be polled, ready made; or a guest.
struct PollSource
{
    std::shared_ptr<obd::IEcu> ecu;
    std::shared_ptr<obd::PowertrainParameter> parameter;
    std::optional<double> hertz;
    std::shared_ptr<IPollGuest> guest{}; // in the place of module and parameter
};

// The poller without its thread: takes one turn after the other, on one thread. channel, if there is one, must outlive
// it.
class PollCycle
{
public:
    using Sink = std::function<void(PollResult const& result)>;

    PollCycle(std::shared_ptr<obd::IObdProxy> const& proxy, std::vector<PollSource> const& sources,
              PollPace const& pace, PidLength length, Units units, Sink sink, IChannelControl* channel = nullptr);

    // How long nothing is to be done yet.
    std::chrono::milliseconds wait();
    // Takes the next turn, due or not.
    void step();

    // Any thread, as what follows.
    std::vector<PollRate> rates();
    // Ends a turn of a guest soon.
    void stop();

private:
    struct Guest
    {
        std::shared_ptr<IPollGuest> guest;
        std::optional<double> hertz;
        std::vector<PollGuestWish> wishes;
        std::size_t first = 0; // of its meters
    };

    using Parts = std::map<unsigned char, std::vector<unsigned char>>; // by PID

    void plan();
    obd::IDevice::Status ask(std::vector<unsigned char> const& request, std::set<unsigned int> const& modules,
                             obd::ResponseMap& responses);
    bool run(PollTask const& task);
    bool runGuest(Guest& guest);
    bool runSingle(PollTask const& task);
    bool runMulti(PollTask const& task);
    bool runDerived(std::size_t member);
    std::vector<unsigned char> usualInputs(PolledParameter const& parameter) const;
    void lendGroup(PolledParameter& parameter, std::vector<unsigned char> const& pids);
    std::map<unsigned int, Parts> fetch(std::vector<unsigned char> const& pids, std::set<unsigned int> const& modules);
    std::optional<Parts> judge(unsigned int module, std::vector<unsigned char> const& pids,
                               std::vector<unsigned char> const* payload);
    bool finish(std::size_t member);

    PollWire m_wire;
    PollPace const m_pace;
    PidLength const m_length;
    Sink const m_sink;
    std::vector<PollWish> m_wishes;
    std::vector<std::unique_ptr<PolledParameter>> m_parameters; // one for each wish
    MultiLimits m_limits;
    // By module and request, where modules' own addresses may be used.
    std::map<std::pair<unsigned int, std::vector<unsigned char>>, AddressTrial> m_trials;
    bool m_mayAddress = false;
    std::vector<PollTask> m_tasks;
    std::vector<Guest> m_guests;
    std::vector<int> m_failures; // in a row, for each task, then for each guest
    DeadlineScheduler m_scheduler;
    PollTime m_notBefore{};
    bool m_limitsChanged = false;

    std::mutex m_mutex;
    PollTime m_now{};                // of the last turn; protected by m_mutex
    std::vector<RateMeter> m_meters; // one for each wish, of the guests too; protected by m_mutex
    std::vector<int> m_silent;       // the same; protected by m_mutex
};

} // namespace velmora
