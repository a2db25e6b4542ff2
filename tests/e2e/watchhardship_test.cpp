#include "tests/e2e/childprocess.h"
#include "tests/support/sanitizer.h"
#include "tests/support/temporaryfolder.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <numeric>
#include <string>
#include <vector>

namespace {

using e2e::ChildProcess;
using testsupport::TemporaryFolder;

// How it ends in an unkind moment; the script tells what the cases are. Under ThreadSanitizer alone it grants more
// time. No other test runs beside these.
void expectEnding(std::string const& name)
{
    std::string const slack = testsupport::underThreadSanitizer ? " 3" : " 1";
    std::string const script = VELMORA_SOURCE_DIR "/tests/e2e/ending.py";
    EXPECT_EQ(std::system(("/usr/bin/python3 " + script + " " VELMORA_PROGRAM " " + name + slack).c_str()), 0);
}

TEST(Watch, EndsInTimeWhileTheNameOfABrokerIsLookedUp)
{
    expectEnding("name");
}

TEST(Watch, EndsInTimeWhileNobodyReadsAnOutput)
{
    expectEnding("pipe");
}

TEST(Watch, EndsInTimeWhileAnAdapterIsCalledThatDoesNotAnswer)
{
    expectEnding("adapter");
}

TEST(Watch, SendsNoRequestToAParkedCar)
{
    std::string const script = VELMORA_SOURCE_DIR "/tests/e2e/parked.py";
    EXPECT_EQ(std::system(("/usr/bin/python3 " + script + " " VELMORA_PROGRAM).c_str()), 0);
}

// The network goes, and no connection is closed.
TEST(Watch, NoticesABrokerThatIsOutOfReachAndLosesNothing)
{
    std::string const script = VELMORA_SOURCE_DIR "/tests/e2e/swallow.py";
    EXPECT_EQ(std::system(("/usr/bin/python3 " + script + " " VELMORA_PROGRAM).c_str()), 0);
}

// Milliseconds from each request for a value to the next, by the adapter's traffic while values are read.
std::vector<int> pausesOn(std::string const& vehicle)
{
    TemporaryFolder const folder;
    ChildProcess watch({"watch", "--port", "sim:" + vehicle + "?instant", "--vehicle", "van", "--settings",
                        folder.file("settings"), "--trace", folder.file("trace"), "--output", "ndjson:-", "--quiet"});
    for (int values = 0; values < 25;) {
        std::string const line = watch.readLine();
        values += line.find("\"sensor\"") != std::string::npos ? 1 : 0;
        if (line.empty()) {
            ADD_FAILURE() << "the watch ended";
            return {};
        }
    }
    watch.interrupt();
    EXPECT_EQ(watch.wait(), 0);
    std::ifstream in(folder.file("trace"));
    std::vector<int> pauses;
    int before = -1;
    for (std::string line; std::getline(in, line);) { // "08:15:00.250 >> 010C1\r"
        int hour = 0;
        int minute = 0;
        int second = 0;
        int milli = 0;
        char request[8] = "";
        if (std::sscanf(line.c_str(), "%d:%d:%d.%d >> %7s", &hour, &minute, &second, &milli, request) != 5) {
            continue;
        }
        bool const live = std::string(request).starts_with("010") && request[3] > '3';
        int const now = ((hour * 60 + minute) * 60 + second) * 1000 + milli;
        if (live && before >= 0) {
            pauses.push_back((now - before + 86400000) % 86400000);
        }
        before = live ? now : -1;
    }
    return pauses;
}

// SAE J1850: a module may be asked each 100 ms; from the model year 2003 on, as soon as it has answered.
TEST(Watch, SparesTheModulesOfAnOldCar)
{
    std::vector<int> const old = pausesOn("petrol-pwm");   // of 2001
    std::vector<int> const later = pausesOn("petrol-vpw"); // of 2003
    ASSERT_GE(old.size(), 10U);
    ASSERT_GE(later.size(), 10U);
    // The trace is written a moment behind the request, and on a busy machine a few milliseconds: none of that is in
    // the mean. Its times are cut to milliseconds.
    EXPECT_GE(std::accumulate(old.begin(), old.end(), 0) / static_cast<int>(old.size()), 99);
    EXPECT_GE(*std::ranges::min_element(old), 90);
    EXPECT_LT(*std::ranges::min_element(later), 90);
}

TEST(Watch, ASecondSignalEndsItAtOnce)
{
    expectEnding("twice");
}

} // namespace
