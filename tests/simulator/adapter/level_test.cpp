// Commands by the version of the ELM327 that brought them, and the guide's table of them.
#include "simulator/adapter/handlers.h"
#include "tests/simulator/conversation.h"

#include <gtest/gtest.h>

#include <fstream>
#include <sstream>

namespace {

struct LevelCase
{
    char const* command; ///< without AT
    int level;
};

TEST(Level, commandsAreKnownFromTheirVersionOn)
{
    LevelCase const cases[] = {
        {"KW1", 120},          {"IFR2", 120},       {"D0", 130},          {"CRA7E8", 130}, {"JE", 130},
        {"FE", 131},           {"SS", 140},         {"RD", 140},          {"SD12", 140},   {"IB48", 140},
        {"CSM1", 142},         {"JHF0", 142},       {"CRA", 142},         {"JTM1", 142},   {"AMC", 200},
        {"AMT20", 200},        {"SH18DA10F1", 200}, {"CRA7XX", 200},      {"CTM1", 210},   {"IFR5", 220},
        {"IB12", 220},         {"CER01", 220},      {"FT", 220},          {"C1", 230},     {"CF18DAF110", 100},
        {"CM1FFFFFFF", 100},   {"SP00", 130},       {"ST6", 100},         {"SW9", 100},    {"@2", 130},
        {"FCSH18DA10F1", 110}, {"PP0CON", 110},     {"PP0COFF", 110},     {"IFRS", 120},   {"MP00FECA", 130},
        {"CRA18DAF110", 130},  {"JTM5", 142},       {"CRA18DAF1XX", 200}, {"FT10", 220},   {"MPFEE91", 142},
        {"WM3E", 120},         {"IB96", 100},       {"WM8011F13E", 100},
    };
    obdsim::AdapterProfile profile = *obdsim::findProfile("elm327-v2.3");
    for (auto const& row : cases) {
        profile.level = row.level;
        EXPECT_TRUE(obdsim::findCommand(profile, row.command)) << row.command;
        profile.level = row.level - 1;
        EXPECT_FALSE(row.level > 100 && obdsim::findCommand(profile, row.command)) << row.command;
    }
}

TEST(Level, savedByteAndWarmStart)
{
    auto host = unplugged("elm327-v2.3");
    EXPECT_EQ(host.ask({"ATE0", "ATSD7F", "ATZ", "ATE0", "ATRD"}), "7F\r\r>");
    host.ask("ATWS");
    EXPECT_LT(host.lastWait(), obdsim::Ms(10));
}

TEST(Level, responsesAreCountedFromV13On)
{
    auto old = simulated("petrol-can11", "elm327-v1.2");
    EXPECT_EQ(old.ask({"ATE0", "ATSP6", "010C1"}), "?\r\r>");
    auto next = simulated("petrol-can11", "elm327-v1.3a");
    EXPECT_EQ(next.ask({"ATE0", "ATSP6", "010C1"}).substr(0, 5), "41 0C");
}

TEST(Level, activityOfTheBusIsCounted)
{
    auto host = simulated("petrol-can11", "elm327-v2.3");
    EXPECT_EQ(host.ask({"ATE0", "ATIA"}), "N\r\r>");
    EXPECT_EQ(host.ask({"ATSP6", "010C1", "ATIA"}), "Y\r\r>");
    EXPECT_EQ(host.ask("ATAMC"), "00\r\r>");
    host.pass(obdsim::Ms(2000));
    EXPECT_EQ(host.ask("ATAMC"), "03\r\r>") << "steps of 655 ms";
    host.pass(obdsim::Ms(1000000));
    EXPECT_EQ(host.ask("ATAMC"), "FF\r\r>");
}

/// "v1.3a" as a level.
int levelOf(std::string const& version)
{
    int const number = (version[1] - '0') * 100 + (version[3] - '0') * 10;
    return number + (version.size() < 5 ? 0 : version[4] == 'a' ? 1 : 2);
}

TEST(Level, guideTellsEachCommandAndItsVersion)
{
    std::ifstream file(VELMORA_SOURCE_DIR "/docs/simulator.md");
    int rows = 0;
    int answeredOnly = 0;
    for (std::string line; std::getline(file, line);) {
        std::istringstream cells(line);
        std::string nothing;
        std::string version;
        std::string samples;
        std::getline(cells, nothing, '|');
        std::getline(cells, version, '|');
        std::getline(cells, samples);
        if (version.size() < 5 || version.substr(0, 2) != " v" || samples.find("`AT") == std::string::npos) {
            continue;
        }
        int const level = levelOf(version.substr(1, version.size() - 2));
        obdsim::AdapterProfile profile = *obdsim::findProfile("elm327-v2.3");
        auto const bar = samples.find('|');
        for (auto at = samples.find("`AT"); at != std::string::npos; at = samples.find("`AT", at + 1)) {
            std::string const command = samples.substr(at + 3, samples.find('`', at + 1) - at - 3);
            profile.level = level;
            EXPECT_TRUE(obdsim::findCommand(profile, command)) << line << ": " << command;
            profile.level = level - 1;
            EXPECT_FALSE(level > 100 && obdsim::findCommand(profile, command)) << line << ": " << command;
            ++rows;
            profile.level = level;
            auto const call = obdsim::findCommand(profile, command);
            bool const idle = call && (call->command->handler == obdsim::handler::accept ||
                                       call->command->handler == obdsim::handler::keep ||
                                       call->command->handler == obdsim::handler::monitor);
            EXPECT_EQ(idle, at > bar) << command << " is in the wrong column";
            answeredOnly += idle ? 1 : 0;
        }
    }
    EXPECT_GE(rows, 100) << "the table of commands";
    EXPECT_GE(answeredOnly, 40);
}

} // namespace
