#pragma once

#include "libvelmora/channel/adapterstate.h"
#include "libvelmora/channel/bringupmemory.h"
#include "libvelmora/channel/countlearner.h"
#include "libvelmora/channel/ichannelcontrol.h"
#include "libvelmora/channel/lateanswers.h"
#include "libvelmora/channel/learntstore.h"
#include "libvelmora/channel/replyhealer.h"
#include "libvelmora/channel/returnnote.h"
#include "libvelmora/channel/silencewatch.h"
#include "libvelmora/channel/turn.h"
#include "libvelmora/channel/waitcutter.h"
#include "libvelmora/channel/wire.h"

#include <obd/idataconnection.h>

#include <atomic>
#include <deque>
#include <filesystem>
#include <map>
#include <memory>
#include <mutex>
#include <set>
#include <string>
#include <thread>

namespace velmora {

struct ChannelOptions
{
    std::string port;                // where the adapter is, for what is kept of it
    bool sleepAtEnd = false;         // the core's wish to send the adapter to sleep is passed on
    bool counting = true;            // requests may get an expected count
    bool shortWait = true;           // the adapter's wait for more replies may be shortened
    std::filesystem::path returns{}; // file of what adapters were not given back; empty: kept in this process only
    WireTime latency{0};             // of the way to the adapter and back, on top of all limits of time
};

// The channel between the core's driver, which is slow and careful, and an adapter, which may be odd: fast and
// forgiving. It knows what it has asked, so it waits for nothing that can't come, and takes out of replies what makes
// them unreadable; a byte of data it never changes.
//
//   idle -> send -> pending -> the prompt -> idle
//                    |  a reply with something missing, a reset: asked again in place
//                    |  the host has given up: the next send waits for the late prompt, or wakes the adapter
//
// All work is done on the threads that send and receive. The members stand in several files: fastchannel.cpp (the
// interface), fastchannel_exchange.cpp (one exchange), fastchannel_reply.cpp (what becomes of a reply),
// fastchannel_recovery.cpp (prompts lost, adapters reset), fastchannel_late.cpp (late replies), fastchannel_haste.cpp
// (counts, waits, memory), fastchannel_cut.cpp (waits that adapters do not shorten), fastchannel_address.cpp (requests
// to one module), fastchannel_stay.cpp (several of them, and what a broken link leaves behind).
class FastChannel : public obd::IDataConnection, public IChannelControl
{
public:
    // The store may be null.
    FastChannel(std::shared_ptr<IWire> wire, ChannelOptions options, std::shared_ptr<LearntStore> store = nullptr);
    ~FastChannel() override;
    FastChannel(FastChannel const&) = delete;
    FastChannel& operator=(FastChannel const&) = delete;

    void setDelimiter(char delimiter) override { m_delimiter = delimiter; }
    bool isValid() const override { return m_wire->isUp() && !m_lost; }
    bool receive(std::vector<unsigned char>& out, int timeoutMs) override;
    void send(std::vector<unsigned char> const& bytes) override;
    void addLogger(obd::IConnectionLogger* logger) override;
    void removeLogger(obd::IConnectionLogger* logger) override;

    void addressModule(std::optional<unsigned int> module) override;
    void address(std::optional<RequestAddress> const& address) override;
    std::string refusedAddress() const override;
    AddressedReply takeReply() override;
    void onConnected() override;
    ChannelStatistics statistics() const override;

    // Ends whatever waits, soon. Any thread.
    void invalidate() { m_wire->giveUp(); }
    // Whether the adapter can't be kept at work, so that the link is taken for lost.
    bool adapterFails() const { return m_lost; }
    // Whether that is because it reset itself again and again.
    bool adapterResets() const { return m_resets; }
    // Whether that is because not a byte has come for seconds, to nothing at all.
    bool adapterGone() const { return m_gone; }

private:
    struct Pending
    {
        ElmCommand command;
        std::string sent;    // the last text for it that was written
        std::string key;     // of what is learnt: the request, and the address that it goes to
        WireTime begunAt{0}; // its first text
        WireTime sentAt{0};
        WireTime heardAt{0};                // the last byte
        WireTime dataAt{0};                 // the last digit of a reply
        WireTime latency{0};                // not given yet to who waits for it
        std::optional<unsigned int> module; // whose reply is waited for, where only one is
        std::optional<unsigned int> count;
        bool addressed = false; // sent to somebody rather than to all
        bool extended = false;  // with an address byte
        bool heard = false;
        bool askedAgain = false;
        bool woken = false;
        bool verifying = false;          // asked once more with the full wait
        bool cutTried = false;           // its wait is not cut (again)
        std::optional<WireTime> cutAt{}; // when its wait was cut
        std::thread::id asker{};
    };

    // What a thread has told of its requests.
    struct ThreadAddress
    {
        std::optional<unsigned int> module;
        std::optional<RequestAddress> address;
        std::string refused;
        AddressedReply reply;
    };

    // One exchange.
    void begin(std::string const& text);
    void write(std::string const& text);
    void writeLine(std::string const& text);
    std::string listen(WireTime until);
    void writePending(std::string const& text);
    void drain();
    void hear(std::string const& bytes);
    void takeReplies();
    std::optional<std::string> cutReply();
    void finish(std::string const& raw);
    bool shouldAskAgain(HealedReply const& reply) const;
    void observe(HealedReply const& reply);
    void deliver(std::string const& text);
    void endExchange();
    ReplyContext context() const;
    std::optional<std::string> ask(std::string const& text, WireTime limit);
    std::optional<std::string> awaitReply(WireTime until);
    bool confirms(std::string const& text, WireTime limit);

    // Prompts lost, adapters reset.
    WireTime latency() const;
    void noteLateness();
    WireTime remedyTime() const;
    void remedy();
    std::optional<std::string> awaitLate(WireTime limit);
    void settle();
    bool isOwed(std::string const& reply);
    bool wake(std::string& before);
    bool tryToWake(std::string& before);
    bool isSilent() const;
    bool isIdentity(std::string const& reply) const;
    bool tellsLostSettings(HealedReply const& reply);
    bool setUpAgain(HealedReply const& reply);

    // Addresses.
    ThreadAddress wantedAddress() const;
    void noteRefusal(std::string const& refused);
    bool setAddress(Pending& pending);
    std::string takeOn(std::vector<AddressChange> const& changes);
    void restoreAddress();
    void leaveNoAddress();
    bool moveStay(std::vector<AddressChange> const& changes, std::string& refused);
    void endStay();
    void noteStay(std::vector<AddressChange> const& changes);
    void strikeNote();
    void giveLeftOversBack();
    void tellReply(HealedReply const& reply);
    void tellHeard(std::string const& raw);

    // Counts, waits, memory.
    std::optional<unsigned int> countFor(Pending const& pending) const;
    bool takeCounted(HealedReply const& reply, WireTime took);
    bool triesProtocol(std::string const& text);
    void recallWait();
    bool fallsBackToSearch(HealedReply const& reply);
    bool needsFullWait(HealedReply const& reply) const;
    void adaptWait(HealedReply const& reply);
    static std::string waitCommand(unsigned int steps);
    static WireTime waitTime(unsigned int steps);
    void setWait(unsigned int steps);
    void giveWaitBack();
    void learnVehicle(HealedReply const& reply);
    std::string adapterKey() const;
    void keepLearnt();

    // Waits that the adapter does not shorten.
    bool triesBus() const;
    bool mayCut() const;
    bool saysEnough() const;
    WireTime cutTime() const;
    void cutWait();
    std::string withoutOwnStop(std::string const& raw) const;
    bool takeCut(HealedReply const& reply);

    void note(Habit habit) { ++m_habits[static_cast<std::size_t>(habit)]; }
    void publish();
    void tellSent(std::string const& bytes);
    void tellReceived(std::string const& bytes);

    std::shared_ptr<IWire> const m_wire;
    ChannelOptions const m_options;
    std::shared_ptr<LearntStore> const m_store;
    std::atomic<char> m_delimiter{'>'};
    std::atomic<bool> m_lost{false};
    std::atomic<bool> m_resets{false};
    std::atomic<bool> m_gone{false};
    std::atomic<bool> m_sleepAnswered{false};
    std::atomic<bool> m_connected{false};
    ReturnNotes const m_returns;

    // An exchange holds it; so does each look at what belongs to one.
    Turn m_exchange;
    std::string m_buffer;
    std::deque<std::string> m_ready;
    std::optional<Pending> m_pending;
    AdapterState m_state;
    HabitCounts m_habits{};
    ReplyHealer m_healer{m_habits};
    CountLearner m_learner;
    BringUpMemory m_memory;
    WaitCutter m_cutter;
    ChannelStatistics m_working;
    bool m_echoChecked = false;
    bool m_echoStuck = false;
    SilenceWatch m_silence;
    bool m_silent = false;    // it did not answer when it was woken
    WireTime m_silentFrom{0}; // where it is silent: the last it said, or was asked
    LateAnswers m_late;
    std::string m_trouble;
    bool m_busSpoke = false; // a request has brought data
    bool m_begun = false;    // something was sent
    bool m_starting = false; // a reset was the last command
    int m_vainGraces = 0;    // receives that could bring nothing, and brought nothing
    int m_protocolsChosen = 0;
    std::optional<WireTime> m_resetAt; // the last reset of the adapter
    int m_triedProtocol = 0;           // sent in the place of a search; 0 for none
    bool m_protocolTried = false;
    unsigned int m_waitSteps = 0;  // of 4.096 ms, where the channel has shortened the wait
    unsigned int m_waitBefore = 0; // what a wait that was given back had been
    unsigned int m_longest = 0;    // the longest that the adapter has agreed to
    bool m_waitsLong = false;      // the adapter does not adapt its wait behind replies
    WireTime m_slowest{0};
    std::vector<AddressStep> m_restore;      // takes back the address that is in force
    std::optional<RequestAddress> m_staying; // the address that is in force between exchanges
    std::vector<AddressChange> m_stayChanges;
    std::vector<std::string> m_noted; // what stands in the note of this port
    int m_addressFailures = 0;        // of modules' own addresses
    std::set<std::string> m_verified; // requests whose silent modules were given the full wait once
    std::string m_vin;

    std::mutex m_loggerMutex; // held while a logger is called, so that none is called once it is removed
    std::vector<obd::IConnectionLogger*> m_loggers;

    mutable std::mutex m_sharedMutex; // a leaf; protects what follows
    std::map<std::thread::id, ThreadAddress> m_addresses;
    ChannelStatistics m_statistics;
};

} // namespace velmora
