// A simulated adapter as a port: its clock follows the real one, and nobody is asked for more than there is to do.

#include "libvelmora/port/opening/openport.h"
#include "libvelmora/port/peerport.h"
#include "simulator/simulation.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <condition_variable>
#include <fstream>
#include <mutex>
#include <utility>

namespace {

using namespace std::chrono_literals;
using Clock = std::chrono::steady_clock;
using velmora::PeerPort;

// Says "late" when its time has come, and at once what it is sent; "bye" is the end of the link.
class TalkingPeer : public obdsim::IPeer
{
public:
    explicit TalkingPeer(obdsim::Time due) : m_due(due) {}

    void receive(std::string_view bytes) override
    {
        m_reply += bytes;
        m_up = bytes != "bye";
    }
    std::optional<obdsim::Time> nextOutput() const override
    {
        ++asked;
        return m_due;
    }
    std::string advanceTo(obdsim::Time time) override
    {
        m_now = std::max(m_now, time);
        std::string said = std::exchange(m_reply, {});
        if (m_due && *m_due <= m_now) {
            m_due.reset();
            said += "late";
        }
        return said;
    }
    obdsim::Time now() const override { return m_now; }
    void connect() override { connected = true; }
    bool linkIsUp() const override { return m_up; }

    mutable std::atomic<int> asked{0};
    std::atomic<bool> connected{false};

private:
    std::optional<obdsim::Time> m_due;
    obdsim::Time m_now{0};
    std::string m_reply;
    bool m_up = true;
};

// What a port over such a peer brings.
struct PeerRig
{
    PeerRig(obdsim::Time due, bool instant) : peer(std::make_shared<TalkingPeer>(due)), port(peer, instant)
    {
        port.start(
            [this](std::string_view bytes) {
                std::lock_guard const lock(mutex);
                said += bytes;
                wake.notify_all();
            },
            [this] {
                std::lock_guard const lock(mutex);
                ++losses;
                wake.notify_all();
            });
    }
    // How long it took until all of that had come.
    std::chrono::milliseconds until(std::string const& text, int lost = 0)
    {
        std::unique_lock lock(mutex);
        EXPECT_TRUE(wake.wait_for(lock, 10s, [&] { return said == text && losses == lost; })) << said;
        return std::chrono::duration_cast<std::chrono::milliseconds>(Clock::now() - start);
    }

    std::mutex mutex;
    std::condition_variable wake;
    std::string said;
    int losses = 0;
    Clock::time_point const start = Clock::now();
    std::shared_ptr<TalkingPeer> peer;
    PeerPort port;
};

TEST(PeerPort, WaitsForWhatIsDueAndDoesNothingMeanwhile)
{
    PeerRig rig(60ms, false);
    EXPECT_GE(rig.until("late"), 59ms);
    EXPECT_TRUE(rig.peer->connected);
    rig.port.write("ATI");
    rig.until("lateATI");
    rig.port.close();
    EXPECT_LE(rig.peer->asked, 8) << "it is asked again for each thing that happens";
    EXPECT_EQ(rig.losses, 0);
}

TEST(PeerPort, AnInstantOneIsMovedOnToWhatIsDue)
{
    PeerRig rig(30min, true);
    EXPECT_LT(rig.until("late"), 5s);
    rig.port.write("ATI");
    EXPECT_LT(rig.until("lateATI"), 5s);
    rig.port.close();
    EXPECT_GE(rig.peer->now(), 30min) << "and is never moved back";
}

TEST(PeerPort, WhatIsWrittenIsHeardThoughMoreIsDueLater)
{
    PeerRig rig(20s, false);
    rig.port.write("ATI");
    EXPECT_LT(rig.until("ATI"), 9s);
    rig.port.write("bye");
    EXPECT_LT(rig.until("ATIbye", 1), 9s) << "what came before the link broke is brought";
    rig.port.write("more");
    rig.port.close();
    EXPECT_EQ(rig.said, "ATIbye");
    EXPECT_EQ(rig.losses, 1);
}

TEST(PeerPort, EndsThoughSomethingIsDue)
{
    PeerRig rig(20s, false);
    rig.port.close();
    EXPECT_LT(Clock::now() - rig.start, 10s);
    EXPECT_EQ(rig.losses, 0);
    PeerRig idle(0ms, false);
    idle.until("late");
    idle.port.close();
    EXPECT_LT(Clock::now() - idle.start, 10s);
}

// The reply to a command that ends a simulated adapter's reply with a prompt.
std::string replyOf(std::string const& address, std::string const& command)
{
    std::mutex mutex;
    std::condition_variable wake;
    std::string reply;
    auto const port = velmora::openPort(velmora::parsePortAddress(address));
    port->start(
        [&](std::string_view bytes) {
            std::lock_guard const lock(mutex);
            reply += bytes;
            wake.notify_all();
        },
        [] {});
    port->write(command + "\r");
    std::unique_lock lock(mutex);
    wake.wait_for(lock, 10s, [&] { return reply.find('>') != std::string::npos; });
    lock.unlock();
    port->close();
    return reply;
}

TEST(PeerPort, OfASimulatedCarHasWhatItsAddressNames)
{
    EXPECT_THAT(replyOf("sim:?instant", "ATI"), testing::HasSubstr("ELM327 v1.5"));
    EXPECT_THAT(replyOf("sim:petrol-can11?instant&adapter=stn2120", "STI"), testing::HasSubstr("STN2120"));
    EXPECT_THAT(replyOf("sim:petrol-can11?instant&fault=error:BUS BUSY@1", "0100"), testing::HasSubstr("BUS BUSY"));
    EXPECT_THAT(replyOf("sim:petrol-kwp-fast?instant", "0100"), testing::HasSubstr("41 00 00 18 00 10"));
    testsupport::TemporaryFolder const folder;
    std::ofstream(folder.file("scenario")) << "0 voltage 9.9\n";
    EXPECT_THAT(replyOf("sim:petrol-can11?instant&scenario=" + folder.file("scenario"), "ATRV"),
                testing::HasSubstr("9.9V"));
}

template <typename Open>
velmora::Error openingFailure(Open open)
{
    try {
        open();
    } catch (velmora::Error const& error) {
        return error;
    }
    return {velmora::ErrorKind::Failed, "none"};
}

TEST(PeerPort, SaysWhatCanNotBePlayed)
{
    for (char const* address : {"sim:no-such-car", "sim:petrol-can11?drive=none", "sim:petrol-can11?adapter=none"}) {
        velmora::Error const error = openingFailure([&] { velmora::openPort(velmora::parsePortAddress(address)); });
        EXPECT_EQ(error.kind(), velmora::ErrorKind::PortFailed) << address;
        EXPECT_THAT(error.what(), testing::StartsWith("Could not start the simulated car: ")) << address;
        EXPECT_THAT(error.hints(), testing::ElementsAre(testing::HasSubstr("velmora simulate --list")));
    }
    testsupport::TemporaryFolder const folder;
    for (std::string const ending : {"", "?instant"}) {
        velmora::Error const error =
            openingFailure([&] { velmora::openReplayPort({folder.file("none.dialogue") + ending}); });
        EXPECT_EQ(error.kind(), velmora::ErrorKind::PortFailed);
        EXPECT_THAT(error.what(), testing::StartsWith("Could not replay the recorded dialogue: "));
        EXPECT_THAT(error.what(), testing::HasSubstr("none.dialogue"));
        EXPECT_THAT(error.what(), testing::Not(testing::HasSubstr("?instant"))) << "which is not of its name";
        EXPECT_THAT(error.hints(), testing::ElementsAre(testing::HasSubstr("velmora record FILE")));
    }
}

} // namespace
