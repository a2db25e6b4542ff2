// Which signals the words of a user mean, how they are shown as rows, and at what rates they are asked for.
#include "libvelmora/session/session.h"
#include "libvelmora/uds/signalchoice.h"
#include "tests/support/temporaryfolder.h"

#include <velmora/error.h>

#include <fmt/format.h>
#include <gtest/gtest.h>

#include <fstream>

namespace velmora {

namespace {

std::string const choiceSignals = R"toml(
[vehicle]
vin = "VELMRAS*"

[[signal]]
id = "GEARBOX"
name = "Gearbox oil"
header = "7E1"
request = "221E1C"
formula = "A"
unit = "°C"
rate = 4

[[signal]]
id = "PART"
name = "Part of the body"
header = "743"
reply = "763"
request = "22F187"
text = { first = 0, count = 2 }

[[signal]]
id = "STATE"
name = "State of the body"
header = "743"
reply = "763"
request = "222801"
formula = "A"
values = { 0 = "off" }

[[signal]]
id = "SUM"
name = "Sum"
formula = "value(\"GEARBOX\")+value(\"STATE\")"

[[signal]]
id = "ANYBODY"
name = "Anybody"
request = "22F40C"
formula = "A"

[[signal]]
id = "OF_ALL"
name = "By the header that all listen to"
header = "7DF"
reply = "7E8"
request = "22F40D"
formula = "A"

[[signal]]
id = "SPEED"
name = "A speed of one's own"
header = "7E1"
request = "221E1D"
formula = "A"

[[signal]]
id = "ELSEWHERE"
name = "On another bus"
header = "18DA10F1"
request = "221E1C"
formula = "A"

[[signal]]
id = "OF_ELSEWHERE"
name = "Worked out of one on another bus"
formula = "value(\"ELSEWHERE\")"

[[signal]]
id = "TWICE_THE_SUM"
name = "Twice"
formula = "value(\"SUM\")*2"

[[signal]]
id = "OFF"
name = "Switched off"
header = "7E1"
request = "221E20"
formula = "A"
enabled = false
reason = "needs session 03"

[[signal]]
id = "OF_OFF"
name = "Worked out of that"
formula = "value(\"OFF\")"
)toml";

class SignalChoiceTest : public testing::Test
{
protected:
    SignalChoiceTest()
    {
        std::string text = choiceSignals;
        for (int i = 1; i < 12; ++i) {
            text += fmt::format("\n[[signal]]\nid = \"CELL_{0}\"\nname = \"Cell number {0}\"\nformula = \"{0}\"\n", i);
        }
        SessionOptions options;
        options.port = "sim:petrol-can11-modules?instant";
        options.settingsFile = m_folder.file("settings.toml");
        options.signalFiles = {file("mine.toml", text),
                               file("other.toml", "[vehicle]\nvin = \"WEX*\"\n[[signal]]\nid = \"STRANGE\"\n"
                                                  "name = \"Of another\"\nrequest = \"2101\"\nformula = \"A\"\n")};
        m_session.emplace(options);
        m_session->connect();
        m_choice.emplace(*m_session);
    }

    std::string file(std::string const& name, std::string const& text) const
    {
        std::ofstream(m_folder.file(name)) << text;
        return m_folder.file(name);
    }
    bool choose(std::string const& word) { return m_choice->choose(parseSensorWish(word), {0x7E8, 0x7E9}); }
    std::string problem(std::string const& word)
    {
        try {
            EXPECT_TRUE(choose(word) || m_choice->chooseByName(parseSensorWish(word), {0x7E8, 0x7E9})) << word;
        } catch (Error const& error) {
            return error.what() + (error.hints().empty() ? "" : " | " + error.hints().front());
        }
        return "none";
    }
    // Module, sensor, request, unit, whether it is a number, rate.
    std::string rows()
    {
        std::string text;
        for (SignalRow const& each : m_choice->rows()) {
            EXPECT_EQ(m_session->signals()->operator[](static_cast<std::size_t>(each.id - firstSignalId)).signal.name,
                      each.name);
            text += fmt::format("{:X} {} {} {} {} {}\n", each.module, each.sensor, each.request, each.unit,
                                each.numeric ? "number" : "words", each.hertz.value_or(-1));
        }
        return text;
    }
    // The rate of each source, and what it tells.
    std::string sources(bool alone)
    {
        std::string text;
        for (PollSource const& each : m_choice->sources(alone)) {
            text += fmt::format("{}:", each.hertz.value_or(-1));
            for (PollGuestWish const& wish : each.guest->wishes()) {
                text += fmt::format(" {:X}/{}", wish.module, wish.sensor);
            }
            text += "\n";
        }
        return text;
    }

    testsupport::TemporaryFolder const m_folder;
    std::optional<Session> m_session;
    std::optional<SignalChoice> m_choice;
};

TEST_F(SignalChoiceTest, ShowsWhatIsChosenAndReadsWhatThatIsWorkedOutOf)
{
    EXPECT_TRUE(m_choice->empty());
    EXPECT_EQ(m_choice->board(), nullptr);
    for (char const* const word : {"RPM", "nothing of the kind", "EVAP_PRESSURE"}) {
        EXPECT_FALSE(choose(word)) << word << " is a standard sensor's, if anyone's";
    }
    for (char const* const word :
         {"SUM", "GEARBOX@5hz", "GEARBOX@5hz", "PART", "STATE", "7E9:ANYBODY", "OF_ALL", "7E8:SPEED"}) {
        EXPECT_TRUE(choose(word)) << word;
    }
    EXPECT_FALSE(m_choice->empty());
    EXPECT_EQ(rows(), "0 SUM   number -1\n"
                      "7E9 GEARBOX 221E1C °C number 5\n"
                      "763 STATE 222801  words -1\n"
                      "763 PART 22F187  words -1\n"
                      "7E9 ANYBODY 22F40C  number -1\n"
                      "0 OF_ALL 22F40D  number -1\n"
                      "7E9 SPEED 221E1D  number -1\n")
        << "one's own speed goes before the standard one; only of all modules one can be chosen";
    EXPECT_EQ(sources(false), "5: 7E9/GEARBOX\n"
                              "1: 763/STATE 763/PART\n"
                              "-1: 7E9/ANYBODY 0/OF_ALL\n"
                              "1: 7E9/SPEED 0/SUM\n")
        << "modules of one's own are asked once a second unless a rate is named";
    EXPECT_EQ(sources(true), "5: 7E9/GEARBOX\n"
                             "-1: 763/STATE 763/PART\n"
                             "-1: 7E9/ANYBODY 0/OF_ALL\n"
                             "-1: 7E9/SPEED 0/SUM\n")
        << "as fast as it goes where nobody waits for them";
    EXPECT_NE(m_choice->board(), nullptr);
}

TEST_F(SignalChoiceTest, AsksAtTheRateOfTheFileOrTheWish)
{
    EXPECT_TRUE(choose("SUM"));
    EXPECT_EQ(rows(), "0 SUM   number -1\n") << "what it is worked out of is not shown";
    EXPECT_EQ(sources(false), "4:\n1: 0/SUM\n");
    m_choice.emplace(*m_session);
    EXPECT_TRUE(choose("TWICE_THE_SUM"));
    EXPECT_EQ(sources(false), "4:\n1: 0/TWICE_THE_SUM\n") << "what the sum needs is read, too";
    m_choice.emplace(*m_session);
    EXPECT_TRUE(choose("GEARBOX"));
    EXPECT_TRUE(choose("SUM@2hz"));
    EXPECT_EQ(rows(), "7E9 GEARBOX 221E1C °C number 4\n0 SUM   number 2\n") << "the rate that was there stays";
    EXPECT_EQ(sources(false), "4: 7E9/GEARBOX\n2: 0/SUM\n") << "inputs are read as often as the sum is wanted";
}

TEST_F(SignalChoiceTest, ChoosesBuiltInDefinitionsOfTheModulesThatOfferThem)
{
    EXPECT_TRUE(choose("ODOMETER@3hz"));
    EXPECT_TRUE(choose("0xA6"));
    EXPECT_EQ(rows(), "7E8 ODOMETER 01A6 km number -1\n") << "once, by the last wish";
    EXPECT_EQ(problem("7E9:A6"),
              "The vehicle does not offer PID A6 (Odometer) | `velmora sensors` lists what it offers");
    EXPECT_EQ(problem("123:A6"),
              "The vehicle does not offer PID A6 (Odometer) | `velmora sensors` lists what it offers");
    EXPECT_EQ(problem("A4"),
              "The vehicle does not offer PID A4 (Transmission Actual Gear Ratio) | `velmora sensors` lists what it "
              "offers")
        << "not of the gear, which nobody can decode";
    EXPECT_EQ(problem("88"), "PID 88 (SCR Inducement System) is not decoded: no layout of its data is known");
    EXPECT_EQ(problem("C3"),
              "PID C3 (Fuel Level Input A) is not decoded: nobody tells for sure how its data is laid out");
}

TEST_F(SignalChoiceTest, TellsWhyASignalCantBeChosen)
{
    std::string const mine = m_folder.file("mine.toml");
    EXPECT_EQ(problem("OFF"),
              "The signal OFF is switched off: needs session 03 | its file " + mine + " says so (enabled = false)");
    EXPECT_EQ(problem("OF_OFF"), "OF_OFF is worked out of OFF, which is switched off or missing");
    EXPECT_EQ(problem("ELSEWHERE"), "The signal ELSEWHERE can't be asked for: the header 18DA10F1 is none of this bus, "
                                    "whose identifiers have 3 digits");
    EXPECT_EQ(problem("OF_ELSEWHERE"), problem("ELSEWHERE")) << "nor may all modules be asked in its place";
    EXPECT_EQ(problem("STRANGE"), "STRANGE is for vehicles WEX*, and this one is VELMRAS1M60000022 | the file " +
                                      m_folder.file("other.toml") + " says so; take its key vin out if it is wrong");
    EXPECT_EQ(problem("body of"), "\"body of\" fits several signals | choose by id: PART, STATE");
    EXPECT_EQ(problem("cell number"), "\"cell number\" fits several signals | choose by id: CELL_1, CELL_2, CELL_3, "
                                      "CELL_4, CELL_5, CELL_6, CELL_7, CELL_8, CELL_9, CELL_10")
        << "ten of eleven";
    EXPECT_EQ(problem("oil"), "none");
    EXPECT_EQ(m_choice->rows().back().sensor, "GEARBOX") << "the only one of that word";
    EXPECT_FALSE(m_choice->chooseByName(parseSensorWish("nothing like that"), {}));
}

} // namespace

} // namespace velmora
