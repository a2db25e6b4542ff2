// A session over a port that is watched: what it says on the way, what it leaves beside the settings, how it ends.
#include "libvelmora/channel/learntstore.h"
#include "libvelmora/channel/returnnote.h"
#include "libvelmora/port/opening/openport.h"
#include "libvelmora/record/dialoguerecorder.h"
#include "libvelmora/session/cyclemeter.h"
#include "libvelmora/session/libraryuse.h"
#include "libvelmora/session/session.h"
#include "tests/support/temporaryfolder.h"

#include <obd/iconnectionmanager.h>
#include <obd/iobdproxy.h>
#include <velmora/error.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <atomic>
#include <fstream>
#include <mutex>
#include <thread>

namespace {

using testing::Contains;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::Not;
using velmora::Error;
using velmora::Session;
using velmora::SessionOptions;

// A simulated adapter with its sent lines noted, which a test may silence or cut.
struct WatchedLine
{
    std::mutex mutex;
    std::vector<std::string> sent; // protected by mutex
    std::atomic<bool> silent = false;
    velmora::IPort::LossHandler cut;

    std::function<std::unique_ptr<velmora::IPort>()> opener(std::string const& car = "sim:petrol-can11?instant")
    {
        return [this, car] { return std::make_unique<Port>(*this, car); };
    }
    std::vector<std::string> all()
    {
        std::lock_guard const lock(mutex);
        return sent;
    }

private:
    struct Port : velmora::IPort
    {
        Port(WatchedLine& theLine, std::string const& car)
            : line(theLine), inner(velmora::openPort(velmora::parsePortAddress(car)))
        {}
        void start(Receiver onBytes, LossHandler onLost) override
        {
            line.cut = onLost;
            inner->start(
                [this, onBytes](std::string_view bytes) {
                    if (!line.silent) {
                        onBytes(bytes);
                    }
                },
                std::move(onLost));
        }
        void write(std::string_view bytes) override
        {
            {
                std::lock_guard const lock(line.mutex);
                line.sent.emplace_back(bytes.substr(0, bytes.find('\r')));
            }
            inner->write(bytes);
        }
        void close() override { inner->close(); }

        WatchedLine& line;
        std::unique_ptr<velmora::IPort> inner;
    };
};

class SessionParts : public testing::Test
{
protected:
    SessionParts()
    {
        m_options.settingsFile = m_folder.file("settings.toml");
        m_options.openPort = m_line.opener();
    }
    // A current value, by the library's way.
    static bool asks(Session& session, unsigned char pid)
    {
        obd::ResponseMap replies;
        session.proxy()->execute(std::vector<unsigned char>{0x01, pid}, replies, 2000);
        return !replies.empty();
    }

    velmora::LibraryUse const m_library{""}; // keeps the catalogue from session to session
    testsupport::TemporaryFolder m_folder;
    WatchedLine m_line;
    velmora::CarOptions m_options;
};

TEST_F(SessionParts, SaysWhatItIsAt)
{
    std::string progress;
    std::string details;
    std::vector<std::string> phases;
    m_options.openPort = nullptr;
    m_options.port = "sim:petrol-can11?instant";
    m_options.onProgress = [&progress](std::string const& lines) { progress += lines; };
    m_options.onDetail = [&details](std::string const& lines) { details += lines; };
    m_options.onPhase = [&phases](std::string const& phase) { phases.push_back(phase); };
    {
        Session session{SessionOptions(m_options)};
        EXPECT_EQ(session.port(), "") << "nobody has looked yet";
        EXPECT_FALSE(session.lost() || session.adapterSilent());
        EXPECT_EQ(session.trouble(), "");
        EXPECT_EQ(session.failedTrace(), "");
        session.check();
        session.checkAdapter();
        session.connect();
        EXPECT_EQ(progress, "Connecting to sim:petrol-can11?instant ...\n");
        EXPECT_THAT(details, HasSubstr("Connected: ELM327 v1.5 "));
        EXPECT_THAT(details, HasSubstr("Control module 7E8: ECM (Engine Control Module)\n"));
        EXPECT_THAT(details, HasSubstr("Control module 7E9: "));
        ASSERT_FALSE(phases.empty());
        EXPECT_EQ(phases.back(), "") << "the line is taken away";
        session.disconnect();
        progress.clear();
        session.connectToPort();
        EXPECT_EQ(progress, "Connecting to sim:petrol-can11?instant ...\n");
    }
    m_options.openPort = m_line.opener();
    m_options.port.clear();
    EXPECT_EQ(Session{SessionOptions(m_options)}.port(), "the application's port");
    m_options.port = "mine";
    EXPECT_EQ(Session{SessionOptions(m_options)}.port(), "mine");
}

TEST_F(SessionParts, HasTheUnitsOfItsOptionsOrOfTheSettings)
{
    using velmora::Units;
    struct Case
    {
        char const* settings;
        std::optional<Units> option;
        Units units;
        Units imperial;
    };
    for (Case const& each :
         {Case{"", {}, Units::Metric, Units::Imperial},
          {"", Units::Imperial, Units::Imperial, Units::Imperial},
          {"", Units::ImperialUk, Units::ImperialUk, Units::ImperialUk},
          {"unitsystem = 1", {}, Units::Imperial, Units::Imperial},
          {"unitsystem = 1", Units::Metric, Units::Metric, Units::Imperial},
          {"unitsystem = 1\n[velmora]\ngallon = 1", {}, Units::ImperialUk, Units::ImperialUk},
          {"unitsystem = 0\n[velmora]\ngallon = 1", {}, Units::Metric, Units::ImperialUk},
          {"unitsystem = 1\n[velmora]\ngallon = 1", Units::Imperial, Units::Imperial, Units::Imperial}}) {
        std::ofstream(m_folder.file("settings.toml")) << "[common]\n" << each.settings << "\n";
        m_options.units = each.option;
        Session const session{SessionOptions(m_options)};
        EXPECT_EQ(session.units(), each.units) << each.settings;
        EXPECT_EQ(session.imperialUnits(), each.imperial) << each.settings;
    }
}

TEST_F(SessionParts, TellsTheAdaptersHabitsThatItMet)
{
    m_options.openPort = m_line.opener("sim:petrol-can11?instant&fault=quirk:echo-stuck");
    std::string details;
    m_options.onDetail = [&details](std::string const& lines) { details += lines; };
    {
        Session session{SessionOptions(m_options)};
        session.connect();
        EXPECT_THAT(details, Not(HasSubstr("habits")));
    }
    EXPECT_THAT(details, HasSubstr("The adapter's habits: echo that stays on, "));
    EXPECT_THAT(details, Not(HasSubstr(", 0x"))) << "what it did not meet is none";
}

TEST_F(SessionParts, CountsFramesButInARecording)
{
    for (bool const recorded : {false, true}) {
        velmora::DialogueRecorder recorder;
        m_line.sent.clear();
        Session session{SessionOptions(m_options)};
        if (recorded) {
            session.record(recorder);
        }
        session.connect();
        for (int i = 0; i < 5; ++i) {
            EXPECT_TRUE(asks(session, 0x0C));
        }
        std::vector<std::string> const sent = m_line.all();
        bool const counted = std::ranges::any_of(
            sent, [](std::string const& each) { return each.starts_with("010C") && each.size() > 4; });
        EXPECT_EQ(counted, !recorded) << "a recording holds what every reader of it would ask";
        EXPECT_EQ(recorder.dialogue().exchanges.empty(), !recorded);
    }
}

TEST_F(SessionParts, RemembersAnAdapterThatSomebodyComesBackTo)
{
    std::filesystem::path const settings = m_folder.file("settings.toml");
    std::filesystem::path const learnt = velmora::LearntStore::besides(settings);
    velmora::ReturnNotes const notes(velmora::ReturnNotes::besides(settings));
    m_options.port = "mine";
    notes.put("mine", {6, {"ATST32"}}); // of a connection that broke
    {
        Session session{SessionOptions(m_options)};
        session.connect();
        EXPECT_TRUE(asks(session, 0x0C));
    }
    EXPECT_TRUE(std::filesystem::exists(learnt));
    EXPECT_FALSE(notes.find("mine"));
    EXPECT_THAT(m_line.all(), Contains("ATST32")) << "given back";
    {
        m_options.forget = true;
        Session session{SessionOptions(m_options)};
        session.connect();
        EXPECT_FALSE(std::filesystem::exists(learnt));
    }
    std::filesystem::remove(learnt);
    notes.put("sim:petrol-can11?instant", {6, {"ATST32"}});
    m_options.forget = false;
    m_options.openPort = nullptr;
    m_options.port = "sim:petrol-can11?instant";
    {
        Session session{SessionOptions(m_options)};
        session.connect();
        EXPECT_TRUE(asks(session, 0x0C));
    }
    EXPECT_FALSE(std::filesystem::exists(learnt)) << "what is simulated in this process is no adapter";
    EXPECT_TRUE(notes.find("sim:petrol-can11?instant")) << "that nobody comes back to";
}

TEST_F(SessionParts, SendsTheAdapterToSleepAtItsEndIfItIsTold)
{
    m_options.sleep = true;
    {
        Session session{SessionOptions(m_options)};
        session.connect();
        EXPECT_THAT(m_line.all(), Not(Contains("ATLP")));
    }
    EXPECT_THAT(m_line.all(), Contains("ATLP"));
    auto const begin = std::chrono::steady_clock::now();
    {
        Session session{SessionOptions(m_options)};
        session.connect();
        m_line.silent = true;
    }
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::milliseconds(2500))
        << "half a second, and what connecting took";
}

TEST_F(SessionParts, AnInterruptionEndsTheWaitForASilentAdapter)
{
    Session session{SessionOptions(m_options)};
    session.connect();
    m_line.silent = true;
    auto const begin = std::chrono::steady_clock::now();
    std::thread interrupter([&session] {
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
        session.interrupt();
    });
    EXPECT_FALSE(asks(session, 0x0C));
    interrupter.join();
    EXPECT_LT(std::chrono::steady_clock::now() - begin, std::chrono::milliseconds(1900)) << "half a second";
    EXPECT_TRUE(session.interrupted());
    try {
        session.check();
        ADD_FAILURE();
    } catch (Error const& error) {
        EXPECT_EQ(error.kind(), velmora::ErrorKind::Interrupted);
    }
}

TEST_F(SessionParts, ABrokenLinkIsTold)
{
    Session session{SessionOptions(m_options)};
    session.connect();
    m_line.cut();
    EXPECT_TRUE(session.lost());
    EXPECT_FALSE(session.adapterSilent());
    try {
        session.check();
        ADD_FAILURE();
    } catch (Error const& error) {
        EXPECT_STREQ(error.what(), "The link to the adapter broke");
        EXPECT_EQ(error.kind(), velmora::ErrorKind::LinkLost);
    }
}

TEST_F(SessionParts, ACycleIsMeasuredFromRequestToDispatch)
{
    Session session{SessionOptions(m_options)};
    session.connect();
    {
        velmora::CycleTap const tap(*session.obd().getConnectionManager(), session.loop());
        asks(session, 0x0C);
        EXPECT_EQ(tap.meter().lostShare(), 0.0);
        session.loop().onDispatchRequested();
        asks(session, 0x0C);
        session.loop().onDispatchRequested();
        double const share = tap.meter().lostShare();
        EXPECT_GT(share, 0.0);
        EXPECT_LT(share, 1.0);
    }
    asks(session, 0x0C);
    session.loop().onDispatchRequested(); // nobody measures any more
}

TEST(SessionProtocol, IsANumberOfTheAdapters)
{
    velmora::CarOptions options;
    for (auto const& [number, known] : {std::pair(-1, false), {0, true}, {1, true}, {9, true}, {10, false}}) {
        options.protocol = number;
        try {
            SessionOptions const made(options);
            EXPECT_TRUE(known) << number;
        } catch (Error const& error) {
            EXPECT_FALSE(known) << number;
            EXPECT_STREQ(error.what(), "A protocol is a number from 1 to 9, or 0 to search for it");
        }
    }
}

} // namespace
