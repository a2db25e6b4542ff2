#include "libvelmora/doctor/portcheck.h"
#include "tests/libvelmora/port/scripteddevice.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

namespace {

using testing::ElementsAre;
using velmora::DoctorCheck;

std::vector<std::string> checkLines(std::vector<DoctorCheck> const& checks)
{
    std::vector<std::string> lines;
    for (DoctorCheck const& each : checks) {
        char const* const mark = each.verdict == DoctorCheck::Verdict::Good   ? "ok "
                                 : each.verdict == DoctorCheck::Verdict::Note ? "note "
                                                                              : "bad ";
        lines.push_back(mark + each.link + ": " + each.finding + "|" + each.advice);
    }
    return lines;
}

TEST(DoctorsPortCheck, TellsOfAConverterThatHoldsBytesBack)
{
    velmora::test::ScriptedDevice const device("ELM327 v1.5\r\r>", B38400);
    testsupport::TemporaryFolder const sys;
    std::filesystem::path const name = std::filesystem::path(device.path()).filename();
    std::filesystem::path const timer = sys.path() / "class" / "tty" / name / "device" / "latency_timer";
    std::filesystem::create_directories(timer.parent_path());
    auto const checked = [&](std::string const& latency) {
        std::ofstream(timer) << latency;
        return checkLines(velmora::checkPort(velmora::SerialAddress{device.path(), 38400}, sys.path()));
    };
    std::string const free = "ok port: " + device.path() + " is there and free|";
    EXPECT_THAT(checked("5\n"), ElementsAre(free,
                                            "note port: the USB converter holds short replies back for 5 ms|as root: "
                                            "echo 1 > " +
                                                timer.string(),
                                            "ok line: an adapter answers at 38400 baud|"));
    for (char const* const quick : {"4\n", "x\n", ""}) {
        EXPECT_THAT(checked(quick), ElementsAre(free, "ok line: an adapter answers at 38400 baud|")) << quick;
    }
}

TEST(DoctorsPortCheck, TellsTheRateThatWasNotNamed)
{
    velmora::test::ScriptedDevice const device("ELM327 v1.5\r\r>", B115200);
    testsupport::TemporaryFolder const sys;
    EXPECT_THAT(checkLines(velmora::checkPort(velmora::SerialAddress{device.path(), 38400}, sys.path())),
                ElementsAre("ok port: " + device.path() + " is there and free|",
                            "bad line: an adapter answers at 115200 baud|name the rate: --baud 115200"));
}

} // namespace
