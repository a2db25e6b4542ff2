// Whole command lines with a person at the terminal.
#include "tests/program/commandrun.h"

#include <atomic>
#include <csignal>
#include <functional>
#include <thread>
#include <unistd.h>

namespace {

using namespace velmora::cli;
using testing::HasSubstr;
using testing::Not;

// What a person does once a text stands there.
struct Deed
{
    std::string seen;
    std::string typed;
    std::function<void()> look = [] {}; // before it is typed
};

struct Shown
{
    int code;
    std::string text;
};

class TerminalRun : public CommandRun
{
protected:
    TerminalRun()
    {
        m_kind.set("xterm");
        m_characters.set("C");
        for (Variable const* const each : {&m_columns, &m_lines, &m_plain}) {
            each->set(nullptr);
        }
    }

    Shown at(std::string const& line, std::vector<Deed> const& deeds) const
    {
        PseudoTerminal terminal(200, 24);
        std::atomic<bool> ended{false};
        std::string text;
        Shown shown{};
        std::fflush(stdout);
        std::thread person([&] {
            sigset_t all; // which are the program's to hear
            sigfillset(&all);
            pthread_sigmask(SIG_BLOCK, &all, nullptr);
            std::size_t from = 0;
            auto deed = deeds.begin();
            auto const end = std::chrono::steady_clock::now() + std::chrono::seconds(20);
            while ((!ended || terminal.hasOutput(0)) && std::chrono::steady_clock::now() < end) {
                text += terminal.hasOutput(20) ? terminal.shown() : "";
                std::size_t const place = deed == deeds.end() ? std::string::npos : text.find(deed->seen, from);
                if (place != std::string::npos) {
                    from = place + deed->seen.size();
                    deed->look();
                    terminal.type(deed->typed);
                    ++deed;
                }
            }
            if (!ended) {
                ::kill(::getpid(), SIGINT); // which ends what waits for more
                terminal.hangUp();
            }
        });
        {
            Replaced const input(STDIN_FILENO, terminal.terminal());
            Replaced const output(STDOUT_FILENO, terminal.terminal());
            Replaced const error(STDERR_FILENO, terminal.terminal());
            shown.code = static_cast<int>(runMainAsItIs(meant(line)));
        }
        ended = true;
        person.join();
        shown.text = std::regex_replace(text, std::regex("\r\n"), "\n");
        return shown;
    }

    Variable const m_kind{"TERM"};

private:
    Variable const m_characters{"LC_ALL"};
    Variable const m_columns{"COLUMNS"};
    Variable const m_lines{"LINES"};
    Variable const m_plain{"NO_COLOR"};
};

TEST_F(TerminalRun, ThreeAnswersAreAYes)
{
    std::string const question = "Forget them? [y/N] ";
    EXPECT_EQ(run("@R scan --history --vehicle van").code, ExitCode::Done);
    Shown const kept = at("history forget van", {{question, "n\n"}});
    EXPECT_EQ(kept.code, 1);
    EXPECT_EQ(kept.text, "1 scan of van would be gone for good.\nForget them? [y/N] n\nNothing was forgotten\n");
    for (char const* const answer : {"", "Yes", " y"}) {
        EXPECT_EQ(at("history forget van", {{question, std::string(answer) + "\n"}}).code, 1) << answer;
    }
    EXPECT_EQ(at("history forget van", {{question, "yes\n"}}).code, 0);
}

TEST_F(TerminalRun, WhatActsOnTheVehicleIsAskedFor)
{
    Shown const clear = at("@R clear", {{"Clear now? [y/N] ", "n\n"}});
    EXPECT_EQ(clear.code, 1);
    EXPECT_THAT(clear.text,
                testing::StartsWith("This clears the confirmed and pending trouble codes of all control modules"));
    EXPECT_THAT(clear.text, testing::EndsWith("Clear now? [y/N] n\nNothing was cleared.\n"));
    EXPECT_EQ(at("@R clear", {{"Clear now? [y/N] ", "yes\n"}}).code, 7) << "the vehicle refuses";
    Shown const routine = at("@R routines --run 01", {{"Run now? [y/N] ", "\n"}});
    EXPECT_EQ(routine.code, 1);
    EXPECT_THAT(
        routine.text,
        testing::StartsWith("This asks control module 7E8 ECU#1 to run routine 01: Evaporative system leak test\n  "));
    EXPECT_THAT(routine.text, HasSubstr("\nThe routine acts on the vehicle. Have it parked safely, with nobody near "
                                        "moving or hot parts.\nRun now? [y/N] "));
    EXPECT_THAT(routine.text, testing::EndsWith("\nNothing was run.\n"));
    EXPECT_EQ(at("@R routines --run 01", {{"Run now? [y/N] ", "Y\n"}}).code, 7);
    EXPECT_THAT(at("@R -y routines --run 01", {}).text, Not(HasSubstr("Run now?")));
}

TEST_F(TerminalRun, ScansAreKeptByWhoSaysSoOnce)
{
    Shown const refused = at("@R scan --vehicle van", {{"Keep this scan and those to come? [y/N] ", "n\n"}});
    EXPECT_EQ(refused.code, 0);
    EXPECT_THAT(refused.text, HasSubstr("to tell later what has changed:\n  " + m_folder.file("history.db") +
                                        "\nNothing leaves this machine."));
    EXPECT_THAT(refused.text, HasSubstr("\nNothing is kept; scan --history keeps a single one.\n"));
    EXPECT_THAT(at("@R scan --vehicle van", {}).text, Not(HasSubstr("Keep this scan")));
    EXPECT_THAT(m_folder.read("settings.toml"), HasSubstr("keep = 0"));
    std::ofstream(m_folder.file("settings.toml")) << "[history]\nkeep = 1\nvehicle = 'truck'\n";
    EXPECT_THAT(at("-p sim:@F/refusing.toml?instant scan", {}).text,
                HasSubstr("\nKept as scan 1 of truck; velmora diff tells what has changed\n"));
    EXPECT_THAT(at("@R scan", {}).text, Not(HasSubstr("Kept as"))) << "quiet";
    EXPECT_THAT(run("history").out, HasSubstr("\n  2  ")) << "but kept";
}

TEST_F(TerminalRun, TheConsoleAsksForLines)
{
    std::string const car = "-p sim:" + m_folder.file("bare.toml") + "?instant console";
    Shown const typed =
        at(car, {{"> ", "ATI\r"}, {"ELM327 v1.5", "\r"}, {"\r> ", "at@1\r"}, {"Interpreter", "exit\r"}});
    EXPECT_EQ(typed.code, 0);
    EXPECT_THAT(typed.text, HasSubstr("\r> ATI\033[K\nELM327 v1.5\n"));
    EXPECT_EQ(at(car, {{"> ", "\x04"}}).code, 0);
    m_kind.set("dumb");
    Shown const plain = at(car, {{"> ", "ATI\n"}, {"ELM327 v1.5", "quit\n"}});
    EXPECT_EQ(plain.code, 0);
    EXPECT_THAT(plain.text, HasSubstr("> ATI\nELM327 v1.5\n> quit\n"));
    EXPECT_THAT(at("@B console", {{"", "ATI\nexit\n"}}).text, Not(HasSubstr("> "))) << "quiet";
}

TEST_F(TerminalRun, LiveValuesHaveAPageOfTheirOwnUnlessTheyAreWantedInLines)
{
    std::string const page = "\033[?1049h";
    Shown const live = at("@B live -n 2 SPEED", {});
    EXPECT_EQ(live.code, 0);
    EXPECT_THAT(live.text, HasSubstr(page));
    std::string const left = live.text.substr(live.text.rfind("\033[?1049l"));
    EXPECT_THAT(left, HasSubstr(", module 7E8 ECU#1, 0 s, "));
    EXPECT_THAT(left, HasSubstr("\nVehicle Speed Sensor       0 km/h ")) << "what was read stays";
    Shown const json = at("@B --json live -n 1 SPEED", {});
    EXPECT_THAT(json.text, testing::StartsWith("{\"time\":\""));
    Shown const csv = at("@B live -n 1 SPEED --csv -", {});
    EXPECT_THAT(csv.text, testing::StartsWith("time,Vehicle Speed Sensor (km/h)\n"));
    EXPECT_EQ(std::count(csv.text.begin(), csv.text.end(), '\n'), 2) << "rows alone";
    m_kind.set("nobody-knows");
    EXPECT_EQ(at("@B live -n 1 SPEED", {}).text,
              "Nothing is known of this kind of terminal, so values come in lines\nVehicle Speed Sensor: 0 km/h\n");
    m_kind.set("dumb");
    EXPECT_EQ(at("@B live -n 1 SPEED", {}).text, "Vehicle Speed Sensor: 0 km/h\n");
}

TEST_F(TerminalRun, AChoiceIsKeptAsSoonAsItIsMade)
{
    auto const layouts = [this] { return m_folder.read("layouts.toml"); };
    std::string const car = "-p sim:" + m_folder.file("bare.toml") + "?instant live";
    bool kept = false;
    Shown const chosen = at(car, {{"q quit", "bs"},
                                  {"Which sensors", "\033OB \r"},
                                  {"Speed", "",
                                   [&] {
                                       auto const end = std::chrono::steady_clock::now() + std::chrono::seconds(5);
                                       while (!kept && std::chrono::steady_clock::now() < end) {
                                           kept = std::filesystem::exists(m_folder.file("layouts.toml")) &&
                                                  layouts().find("big\":false") != std::string::npos;
                                           std::this_thread::yield();
                                       }
                                   }},
                                  {"", "q"}});
    EXPECT_EQ(chosen.code, 0);
    EXPECT_TRUE(kept) << "while it runs, with the plain table";
}

TEST_F(TerminalRun, ALayoutThatTheVehicleNoLongerOffersIsNone)
{
    std::string const car = "@B live";
    Shown const first = at(car, {{"q quit", "bq"}});
    EXPECT_EQ(first.code, 0);
    std::string const layouts = m_folder.read("layouts.toml");
    std::string const other = std::regex_replace(layouts, std::regex("\\[\"7E8[^\\]]*\\]"), "[\"7E8:99\"]");
    ASSERT_NE(other, layouts) << layouts;
    std::ofstream(m_folder.file("layouts.toml")) << other;
    Shown const second = at(car, {{"q quit", "q"}});
    EXPECT_EQ(second.code, 0) << second.text;
    EXPECT_THAT(second.text, HasSubstr("Vehicle Speed Sensor"));
}

TEST_F(TerminalRun, ARecordingKeepsItsUnitsAndColumns)
{
    Shown const fixed =
        at("@B live SPEED --csv @F/r.csv", {{"q quit", "u"}, {"units are fixed", "p"}, {"columns are fixed", "sq"}});
    EXPECT_EQ(fixed.code, 0);
    Shown const free = at("@B live SPEED", {{"q quit", "ru"},
                                            {"mph", "w"},
                                            {"Recording to", "u"},
                                            {"units are fixed", "w"},
                                            {"Recorded to", "n"},
                                            {"Noted in", "pspq"}});
    EXPECT_EQ(free.code, 0);
    std::string noted;
    for (auto const& each : std::filesystem::recursive_directory_iterator(m_folder.path())) {
        if (each.path().filename().string().starts_with("snapshot")) {
            noted = m_folder.read(std::filesystem::relative(each.path(), m_folder.path()).string());
        }
    }
    EXPECT_THAT(noted, HasSubstr("\nVehicle Speed Sensor "));
}

TEST_F(TerminalRun, AllThatWasReadStaysHoweverMuchItIs)
{
    std::ofstream(m_folder.file("much.toml"))
        << "name = \"Much\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\n"
           "live = \"04 05 06 07 0B 0C 0D 0E 0F 10 11 1F 21 2F 30 31 33 42 43 44 45 46 47 49 4A 4C 5C\"\n";
    Shown const ended = at("-q -p sim:@F/much.toml?instant live all -n 1", {});
    std::string const left = ended.text.substr(ended.text.rfind("\033[?1049l"));
    EXPECT_GE(std::count(left.begin(), left.end(), '\n'), 2 + 27);
    EXPECT_THAT(left, HasSubstr("\nEngine Oil Temperature"));
}

TEST_F(TerminalRun, AnInterruptEndsLiveValuesAtOnce)
{
    auto const start = std::chrono::steady_clock::now();
    Shown const ended = at("@B live SPEED", {{"km/h", "", [] { ::kill(::getpid(), SIGINT); }}});
    EXPECT_EQ(ended.code, 130);
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(2));
    EXPECT_THAT(ended.text.substr(ended.text.rfind("\033[?1049l")), HasSubstr("\nVehicle Speed Sensor       0 km/h "))
        << "what was read stays";
}

TEST_F(TerminalRun, WhoAsksTooMuchIsWarnedAtTheBottom)
{
    std::string const car = "-p sim:" + m_folder.file("bare.toml") + "?instant live --fast SPEED";
    Shown const fast = at(car, {{"Asking without the pause that spares the vehicle; ", "xq"}});
    EXPECT_EQ(fast.code, 0);
    EXPECT_THAT(fast.text, Not(HasSubstr("control modules\n"))) << "no line of its own";
    EXPECT_THAT(
        run(car + " -n 1").err,
        testing::EndsWith(
            " ...\nAsking without the pause that spares the vehicle; too much traffic has upset control modules\n"));
    EXPECT_EQ(run("-q " + car + " -n 1").err, "");
}

TEST_F(TerminalRun, LimitsAreThoseOfMetricRecordings)
{
    std::string names = "time";
    std::string values = "2024-03-07T09:05:00.000Z";
    std::string const units[] = {"mph", "\u00B0F", "psi", "mi", "hp", "lb/min", "inHg", "inH2O", "V"};
    for (std::size_t i = 0; i < std::size(units); ++i) {
        std::string const name = "S" + std::to_string(i);
        names += "," + name + " (" + units[i] + ")";
        values += ",5";
    }
    EXPECT_EQ(run("settings limit.S0 1").code, ExitCode::Done);
    std::string const limit = m_folder.read("settings.toml");
    std::size_t const line = limit.find("S0");
    ASSERT_NE(line, std::string::npos);
    for (std::size_t i = 1; i < std::size(units); ++i) {
        std::ofstream(m_folder.file("settings.toml"), std::ios::app) << "S" << i << limit.substr(line + 2);
    }
    std::ofstream(m_folder.file("drive.csv")) << names + "\n" + values + "\n";
    Shown const played =
        at("live --play @F/drive.csv", {{"drive.csv, 9 sensors, 2024-03-07T09:05:00.000Z", "b"}, {"S8", "q"}});
    EXPECT_EQ(played.code, 0);
    EXPECT_THAT(played.text, HasSubstr("!5 V"));
    EXPECT_EQ(played.text.find('!'), played.text.rfind('!')) << "and no other";
    for (char const* const unit : {"mph", "oF", "psi", "mi", "hp", "lb/min", "inHg", "inH2O"}) {
        EXPECT_THAT(played.text, HasSubstr(std::string("5 ") + unit));
    }
}

} // namespace
