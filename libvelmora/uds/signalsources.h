#pragma once

#include "libvelmora/poll/pollcycle.h"
#include "libvelmora/uds/signalgroup.h"

#include <cstddef>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace velmora {

// Of a module that others share the bus with: setting the adapter up takes time.
inline constexpr double usualSignalRate = 1.0;

// Makes sources of a poller out of signals: a group for each module and rate, so that the adapter is set up once for
// all of them.
class SignalSources
{
public:
    SignalSources(std::shared_ptr<SignalBoard> board, std::shared_ptr<ModuleAsker> asker)
        : m_board(std::move(board)), m_asker(std::move(asker))
    {}

    // A signal that is asked for: of this module, at this address (nothing: of all), so often (nothing: as it fits).
    void add(ChosenSignal const& signal, unsigned int module, std::optional<RequestAddress> const& address,
             std::optional<double> hertz);
    // One that is worked out of others.
    void addWorkedOut(ChosenSignal const& signal) { m_workedOut.push_back(signal); }

    // All of them; what is worked out comes behind the last group.
    std::vector<PollSource> take();

private:
    struct Group
    {
        std::shared_ptr<SignalGroup> guest;
        std::optional<double> hertz;
        std::vector<std::vector<unsigned char>> requests;
    };

    Group& groupFor(std::string const& key, std::vector<unsigned char> const& request,
                    std::optional<RequestAddress> const& address, std::optional<double> hertz);

    std::shared_ptr<SignalBoard> const m_board;
    std::shared_ptr<ModuleAsker> const m_asker;
    std::vector<Group> m_groups;
    std::map<std::string, std::size_t> m_open; // by key: the group that takes more
    std::vector<ChosenSignal> m_workedOut;
};

} // namespace velmora
