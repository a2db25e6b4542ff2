// What the doctor gives to who is asked for help, and how it talks with an adapter that takes its time.

#include "libvelmora/doctor/adaptertalk.h"
#include "libvelmora/doctor/doctor.h"
#include "libvelmora/record/dialoguerecorder.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>
#include <velmora/version.h>

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <chrono>
#include <fstream>
#include <sys/utsname.h>
#include <thread>

namespace velmora {

namespace {

using namespace std::chrono_literals;
using testing::AllOf;
using testing::HasSubstr;
using testing::Not;

class DoctorBundle : public testing::Test
{
protected:
    std::string bundleOf(std::string const& port)
    {
        SessionOptions options;
        options.port = port;
        options.settingsFile = m_folder.file("settings.toml");
        Session session(options);
        DialogueRecorder recorder;
        DoctorReport const report = examine(session, recorder);
        return makeBundle(report, session, recorder, false);
    }

    testsupport::TemporaryFolder const m_folder;
};

TEST_F(DoctorBundle, TellsVersionsReportSettingsAndAllThatPassed)
{
    utsname system = {};
    ::uname(&system);
    std::string const bundle = bundleOf("sim:petrol-can11?instant");
    EXPECT_THAT(bundle, testing::StartsWith(std::string("Velmora ") + versionText + " on " + system.sysname + " " +
                                            system.release + " " + system.machine + "\n\nok     port"));
    EXPECT_THAT(bundle, HasSubstr("\nSettings\n\n(none)\n\nDialogue\n\nvehicle: unknown\nadapter: ELM327 v1.5\n"));
    EXPECT_THAT(bundleOf("/dev/velmora-none"),
                AllOf(HasSubstr("there is no /dev/velmora-none"), HasSubstr("vehicle: unknown\nadapter: unknown\n")));
}

// What holds one of these words may be a secret.
TEST_F(DoctorBundle, LeavesSecretsOut)
{
    std::ofstream(m_folder.file("settings.toml"))
        << "a.password = 1\nsecretary = 2\ntokens = 3\nkeyhole = 4\nusername = 5\n"
           "hosts = 6\nurls = 7\nx = 'tcp://8'\nmac = 9\nunitsystem = 10\n\nlast = 11\n";
    std::string const bundle = bundleOf("/dev/velmora-none");
    std::string nine;
    for (int i = 0; i < 9; ++i) {
        nine += "(left out)\n";
    }
    EXPECT_THAT(bundle, HasSubstr("\nSettings\n\n" + nine + "unitsystem = 10\n\nlast = 11\n\nDialogue\n"));
}

// An adapter that answers on a thread of its own, a little later.
class LateAdapter : public IPort
{
public:
    explicit LateAdapter(std::vector<std::string> pieces) : m_pieces(std::move(pieces)) {}
    ~LateAdapter() override { LateAdapter::close(); }
    LateAdapter(LateAdapter const&) = delete;
    LateAdapter& operator=(LateAdapter const&) = delete;

    void start(Receiver onBytes, LossHandler onLost) override
    {
        m_onBytes = std::move(onBytes);
        m_onLost = std::move(onLost);
    }
    void write(std::string_view /*bytes*/) override
    {
        close();
        m_thread = std::thread([this] {
            std::this_thread::sleep_for(20ms);
            for (std::string const& piece : m_pieces) {
                m_onBytes(piece);
            }
            if (m_pieces.empty()) {
                m_onLost();
            }
        });
    }
    void close() override
    {
        if (m_thread.joinable()) {
            m_thread.join();
        }
    }

private:
    std::vector<std::string> const m_pieces;
    Receiver m_onBytes;
    LossHandler m_onLost;
    std::thread m_thread;
};

std::optional<std::string> saidLate(std::vector<std::string> const& pieces, std::chrono::milliseconds limit = 8000ms)
{
    AdapterTalk talk(std::make_unique<LateAdapter>(pieces));
    auto const start = std::chrono::steady_clock::now();
    std::optional<std::string> reply = talk.ask("ATI", limit);
    EXPECT_LT(std::chrono::steady_clock::now() - start, 5s) << "who waits is woken";
    EXPECT_EQ(talk.lost(), pieces.empty());
    return reply;
}

TEST(LateAdapterTalk, EndsWithThePromptOrTheLink)
{
    EXPECT_EQ(saidLate({"ELM327 ", "v1.5\r\r>"}), "ELM327 v1.5");
    EXPECT_EQ(saidLate({}), std::nullopt);
}

TEST(LateAdapterTalk, EndsWhenWhoAsksIsInterrupted)
{
    int checks = 0;
    AdapterTalk talk(std::make_unique<LateAdapter>(std::vector<std::string>{"no prompt"}), [&checks] {
        if (++checks == 2) {
            throw Error(ErrorKind::Interrupted, "interrupted", {});
        }
    });
    auto const start = std::chrono::steady_clock::now();
    EXPECT_THROW(talk.ask("ATI", 8000ms), Error);
    EXPECT_LT(std::chrono::steady_clock::now() - start, 2s);
    EXPECT_EQ(checks, 2);
}

TEST(LateAdapterTalk, HearsNoMoreThanAnybodyHasToSay)
{
    EXPECT_TRUE(saidLate({std::string(65535, 'x'), ">"}));
    EXPECT_FALSE(saidLate({std::string(65536, 'x'), ">"}, 60ms));
}

} // namespace

} // namespace velmora
