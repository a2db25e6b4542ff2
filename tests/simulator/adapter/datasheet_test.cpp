#include "tests/simulator/conversation.h"

#include <gtest/gtest.h>

#include <algorithm>

// The dialogues that the data sheets of the ELM327 print, and those of real cars that are public, played one by one.
// Their cars stand in front of each group; "\r" is shown as "|".

namespace {

struct Line
{
    char const* ask;
    char const* reply; ///< without the prompt
};

struct Example
{
    char const* source;
    char const* adapter;
    std::string car;
    std::vector<Line> lines;
};

std::string canCar(std::string const& module)
{
    return "name = \"Car\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\nlatency = 5\n" + module;
}

std::string const printedCar =
    canCar("[module.fixed]\n\"04\" = \"3F\"\n\"05\" = \"44\"\n\"0B\" = \"21\"\n\"0C\" = \"17 B8\"\n"
           "[module.info]\nvin = \"1D4GP00R55B123456\"\n");
std::string const runningCar = canCar("[module.fixed]\n\"0C\" = \"1A F8\"\n\"05\" = \"7B\"\n");
std::string const countedCar = canCar("[module.fixed]\n\"01\" = \"00 07 E5 00\"\n\"03\" = \"01 00\"\n\"04\" = \"00\"\n"
                                      "\"06\" = \"80\"\n\"07\" = \"7D\"\n\"0C\" = \"00 00\"\n");

std::vector<Example> const examples = {
    {"ELM327DSJ, page 45: several PIDs in one request, answered in their order",
     "elm327-v2.1",
     printedCar,
     {{"ATE0", "ATE0|OK|"},
      {"ATSP6", "OK|"},
      {"01 04 05 0B 0C", "00A|0: 41 04 3F 05 44 0B |1: 21 0C 17 B8 00 00 00 |"},
      {"01 0B 04 0C 05", "00A|0: 41 0B 21 04 3F 0C |1: 17 B8 05 44 00 00 00 |"}}},
    {"ELM327DSJ, page 42: a long message has its length and the numbers of its lines",
     "elm327-v2.1",
     printedCar,
     {{"ATE0", "ATE0|OK|"},
      {"ATSP6", "OK|"},
      {"0902", "014|0: 49 02 01 31 44 34 |1: 47 50 30 30 52 35 35 |2: 42 31 32 33 34 35 36 |"}}},
    {"ELM327DSJ, page 41: with headers all received bytes are printed, padding too",
     "elm327-v2.3",
     runningCar,
     {{"ATE0", "ATE0|OK|"},
      {"ATSP6", "OK|"},
      {"ATH1", "OK|"},
      {"01 0C", "7E8 04 41 0C 1A F8 00 00 00 |"},
      {"ATD1", "OK|"},
      {"01 0C", "7E8 8 04 41 0C 1A F8 00 00 00 |"},
      {"ATCAF0", "OK|"},
      {"02 01 0C", "7E8 8 04 41 0C 1A F8 00 00 00 |"}}},
    {"ELM327DSJ, pages 30 and 32: the digit that tells how many responses come",
     "elm327-v1.5",
     runningCar,
     {{"ATE0", "ATE0|OK|"}, {"ATSP6", "OK|"}, {"01 05", "41 05 7B |"}, {"01 05 1", "41 05 7B |"}}},
    {"a public log of a car: six PIDs with a count of three frames",
     "elm327-v1.5",
     countedCar,
     {{"ATE0", "ATE0|OK|"},
      {"ATSP6", "OK|"},
      {"ATH1", "OK|"},
      {"ATS0", "OK|"},
      {"0101030406070C3", "7E8101241010007E500|7E82103010004000680|7E822077D0C00000000|"}}},
    {"ELM327DSJ, page 8: blanks, small letters and control characters don't matter; CR alone repeats",
     "elm327-v1.5",
     runningCar,
     {{"ATE0", "ATE0|OK|"},
      {"at sp 6", "OK|"},
      {"01\t0c", "41 0C 1A F8 |"},
      {"", "41 0C 1A F8 |"},
      {"A t I", "ELM327 v1.5|"},
      {"", "ELM327 v1.5|"}}},
    {"ELM327DSH, page 28: at most seven data bytes, eight with AL",
     "elm327-v1.5",
     runningCar,
     {{"ATE0", "ATE0|OK|"},
      {"ATSP6", "OK|"},
      {"01 01 02 03 04 05 06 07", "?|"},
      {"ATQQ", "?|"},
      {"ATIIA 51x", "?|"},
      {"STI", "?|"}}},
    {"ELM327DSJ, page 27: a found protocol is told with an A",
     "elm327-v1.5",
     runningCar,
     {{"ATE0", "ATE0|OK|"},
      {"ATSP0", "OK|"},
      {"01 0C", "SEARCHING...|41 0C 1A F8 |"},
      {"ATDPN", "A6|"},
      {"ATDP", "AUTO, ISO 15765-4 (CAN 11/500)|"},
      {"ATSP6", "OK|"},
      {"ATDPN", "6|"}}},
};

std::string shown(std::string reply)
{
    std::replace(reply.begin(), reply.end(), '\r', '|');
    return reply;
}

TEST(DataSheet, printedDialoguesArePlayedAsPrinted)
{
    for (Example const& example : examples) {
        SCOPED_TRACE(example.source);
        Conversation host = withVehicle(example.car, example.adapter);
        for (Line const& line : example.lines) {
            EXPECT_EQ(shown(host.ask(std::string(line.ask))), std::string(line.reply) + "|>") << line.ask;
        }
    }
}

} // namespace
