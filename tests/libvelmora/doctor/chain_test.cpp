// Each link of the chain from the port to the modules, broken or odd.

#include "libvelmora/doctor/doctor.h"
#include "libvelmora/doctor/portcheck.h"
#include "libvelmora/record/dialoguerecorder.h"
#include "tests/libvelmora/port/asuser.h"
#include "tests/libvelmora/port/scripteddevice.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <fstream>
#include <grp.h>
#include <sys/file.h>
#include <sys/stat.h>

namespace velmora {

namespace {

using testing::AllOf;
using testing::HasSubstr;
using testing::Not;

std::string lineText(std::vector<DoctorCheck> const& checks)
{
    DoctorReport report;
    report.checks = checks;
    return toText(report);
}

TEST(DoctorPort, ItsLineRateIsNamedWhereItIsAnother)
{
    test::ScriptedDevice const adapter("ELM327 v1.5\r\r>", B115200);
    std::string const right = lineText(checkPort(SerialAddress{adapter.path(), 115200}));
    EXPECT_THAT(right, HasSubstr("ok     line       an adapter answers at 115200 baud"));
    std::string const wrong = lineText(checkPort(SerialAddress{adapter.path(), 38400}));
    EXPECT_THAT(wrong, AllOf(HasSubstr("FAILS  line       an adapter answers at 115200 baud"),
                             HasSubstr("name the rate: --baud 115200")));
}

TEST(DoctorPort, AConverterThatHoldsRepliesBackIsNamed)
{
    test::ScriptedDevice const adapter("ELM327 v1.5\r\r>", B38400);
    testsupport::TemporaryFolder const sys;
    std::filesystem::path const folder =
        sys.path() / "class/tty" / std::filesystem::path(adapter.path()).filename() / "device";
    std::filesystem::create_directories(folder);
    for (bool const slow : {true, false}) {
        std::ofstream(folder / "latency_timer") << (slow ? "16\n" : "1\n");
        std::string const text = lineText(checkPort(SerialAddress{adapter.path(), 38400}, sys.path()));
        EXPECT_EQ(text.find("holds short replies back for 16 ms") != std::string::npos, slow) << text;
        EXPECT_EQ(text.find("echo 1 > " + (folder / "latency_timer").string()) != std::string::npos, slow) << text;
    }
}

TEST(DoctorPort, WhoElseStandsThereIsTold)
{
    test::ScriptedDevice const console("switch>", B0);
    EXPECT_THAT(lineText(checkPort(SerialAddress{console.path(), 38400})),
                HasSubstr("something answers that is no adapter: \"switch\""));
    int const other = ::open(console.path().c_str(), O_RDWR | O_NOCTTY | O_CLOEXEC);
    ASSERT_EQ(::flock(other, LOCK_EX | LOCK_NB), 0);
    EXPECT_THAT(lineText(checkPort(SerialAddress{console.path(), 38400})),
                AllOf(HasSubstr("FAILS  port       held by another program; by which is not readable"),
                      HasSubstr("end that program")));
    ::close(other);
    ASSERT_EQ(::chmod(console.path().c_str(), 0), 0);
    struct stat status = {};
    ASSERT_EQ(::stat(console.path().c_str(), &status), 0);
    group const* const owners = ::getgrgid(status.st_gid);
    std::string const name = owners != nullptr ? owners->gr_name : "";
    auto const tellsTheGroup = [&console, &name] {
        std::string const text = lineText(checkPort(SerialAddress{console.path(), 38400}));
        bool const told = text.find("not yours to open") != std::string::npos &&
                          text.find("add your user to the group " + name + " and") != std::string::npos;
        return told ? 0 : 1;
    };
    EXPECT_EQ(test::asUser(console.path(), false, tellsTheGroup), 0);
}

class DoctorChain : public testing::Test
{
protected:
    DoctorReport examineCar(std::string const& port)
    {
        SessionOptions options;
        options.port = port;
        options.settingsFile = (m_folder.path() / "settings.toml").string();
        Session session(options);
        DialogueRecorder recorder;
        DoctorReport report = examine(session, recorder);
        m_bundle = makeBundle(report, session, recorder, false);
        return report;
    }
    std::string examined(std::string const& fault) { return toText(examineCar("sim:petrol-can11?instant&" + fault)); }
    // What somebody does to the car at its beginning.
    std::string after(std::string const& command)
    {
        std::string const file = (m_folder.path() / "scenario").string();
        std::ofstream(file) << "0 " << command << "\n";
        return examined("scenario=" + file);
    }

    testsupport::TemporaryFolder m_folder;
    std::string m_bundle;
};

TEST_F(DoctorChain, TheAdaptersHabitsAndContradictionsAreTold)
{
    EXPECT_THAT(examined("fault=echo"), AllOf(HasSubstr("note   adapter    its echo stays on in spite of ATE0"),
                                              HasSubstr("Met on the way: echo that stays on, ")));
    EXPECT_THAT(examined("fault=prompt@3"),
                AllOf(Not(HasSubstr("echo stays on")), HasSubstr("Met on the way: lost prompts, 1x")))
        << "a lost prompt is no echo";
    EXPECT_THAT(examined("fault=quirk:ok-to-all"), AllOf(HasSubstr("says OK to a command that does not exist"),
                                                         Not(HasSubstr("Commands that are missing"))))
        << "its matrix is worth nothing";
    EXPECT_THAT(examined("adapter=stn2120"),
                AllOf(HasSubstr("ok     adapter    STN2120 v5.8.1"), Not(HasSubstr("Commands that are missing"))));
    EXPECT_THAT(after("voltage 11.6"), HasSubstr("11.6 V at the socket: a weak battery"));
    EXPECT_THAT(toText(examineCar("sim:petrol-kwp-fast?instant")),
                AllOf(HasSubstr("ISO 14230-4"), HasSubstr("PIDs in one request: 1\n")));
}

TEST_F(DoctorChain, WithoutIgnitionEachBusIsTriedInTheAdaptersOwnWords)
{
    std::string const text = after("ignition off");
    EXPECT_THAT(text,
                AllOf(HasSubstr("note   ignition   off, by the adapter's pin"), HasSubstr("is the ignition on?\n"),
                      HasSubstr("1 SAE J1850 PWM: NO DATA"), HasSubstr("3 ISO 9141-2: BUS INIT: ...ERROR"),
                      HasSubstr("6 CAN 11 bit, 500 kbit/s: CAN ERROR"),
                      HasSubstr("9 CAN 29 bit, 250 kbit/s: CAN ERROR")));
    EXPECT_TRUE(
        text.ends_with("The bus is where it breaks: The adapter (ELM327 v1.5) on sim:petrol-can11?instant&scenario=" +
                       (m_folder.path() / "scenario").string() +
                       " works, but no control module answers; it reports CAN ERROR; is the ignition on?\n"))
        << text;
}

// While the bus is looked for, and later, while values are measured.
TEST_F(DoctorChain, ALinkThatBreaksOnTheWayIsTheFinding)
{
    EXPECT_THAT(examined("fault=loss@900"), AllOf(HasSubstr("FAILS  port       The link to the adapter"),
                                                  HasSubstr("The port is where it breaks: ")));
    DoctorReport const late = examineCar("sim:petrol-can11?instant&fault=loss@2600");
    EXPECT_THAT(toText(late), AllOf(HasSubstr("ok     modules    7E8 ECM"), HasSubstr("The port is where it breaks: "),
                                    Not(HasSubstr("Within reach"))));
    EXPECT_THAT(m_bundle, HasSubstr("The port is where it breaks: ")) << "of which a bundle can be made all the same";
}

} // namespace

} // namespace velmora
