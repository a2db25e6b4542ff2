#pragma once

#include "libvelmora/poll/ipollguest.h"
#include "libvelmora/uds/moduleasker.h"
#include "libvelmora/uds/requeststate.h"
#include "libvelmora/uds/signalboard.h"

#include <atomic>
#include <map>
#include <memory>
#include <optional>
#include <vector>

namespace velmora {

// The signals of one module that are read at one rate: asks for them one behind the other, so that the adapter is set
// up for the module once a turn. Without an address they are asked of all modules by the bus's standard request.
class SignalGroup : public IPollGuest
{
public:
    // The asker may be shared by the groups of one poller.
    SignalGroup(std::shared_ptr<SignalBoard> board, std::shared_ptr<ModuleAsker> asker,
                std::optional<RequestAddress> address);

    // The module whose replies these are, 0 if any may answer.
    void add(ChosenSignal const& signal, unsigned int module);
    // Signals that are worked out of those of this group, and told behind its turn.
    void addWorkedOut(ChosenSignal const& signal) { m_workedOut.push_back(signal); }

    std::vector<PollGuestWish> wishes() const override;
    std::vector<PollResult> turn(PollWire& wire) override;
    void stop() override { m_stop = true; }

private:
    struct Member
    {
        ChosenSignal signal;
        unsigned int module = 0;
    };
    struct Request
    {
        std::vector<unsigned char> bytes;
        std::vector<Member> members;
        RequestState state;
        std::optional<std::size_t> length; // of the data, where all its signals tell one
        bool provedLength = false;         // a reply of that length has come
    };

    void askOne(PollWire& wire, Request& request, std::vector<PollResult>& results);
    void askBroadcast(PollWire& wire, Request& request, std::vector<PollResult>& results);
    bool askTogether(PollWire& wire, std::vector<Request*> const& requests, std::vector<PollResult>& results);
    std::vector<Request*> together(std::vector<Request*> const& due) const;
    void give(Request& request, ModuleAnswer const& answer, PollWire& wire, std::vector<PollResult>& results);
    void giveNothing(Request const& request, std::vector<PollResult>& results);
    std::vector<ChosenSignal> signalsOf(Request const& request) const;

    std::shared_ptr<SignalBoard> const m_board;
    std::shared_ptr<ModuleAsker> const m_asker;
    std::optional<RequestAddress> const m_address;
    std::vector<std::unique_ptr<Request>> m_requests;
    std::vector<ChosenSignal> m_workedOut;
    std::atomic<bool> m_stop{false};
    bool m_severalFail = false;
};

} // namespace velmora
