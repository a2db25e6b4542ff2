// Reports on a terminal of 40 columns.

#include "tests/e2e/childprocess.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <sstream>

namespace {

using e2e::Outcome;
using e2e::runOnTerminal;
using e2e::runVelmora;

std::vector<std::string> sortedWords(std::string const& text)
{
    std::istringstream in(text);
    std::vector<std::string> words;
    for (std::string word; in >> word;) {
        words.push_back(word);
    }
    std::sort(words.begin(), words.end());
    return words;
}

std::ptrdiff_t charactersOf(std::string const& utf8)
{
    return std::count_if(utf8.begin(), utf8.end(),
                         [](char byte) { return (static_cast<unsigned char>(byte) & 0xC0) != 0x80; });
}

class NarrowTerminal : public testing::Test
{
protected:
    NarrowTerminal() { ::setenv("COLUMNS", "40", 1); }
    ~NarrowTerminal() override { ::unsetenv("COLUMNS"); }

    static std::vector<std::string> arguments(std::vector<std::string> const& rest)
    {
        std::vector<std::string> all = {"-q", "--color", "never", "-p", "sim:petrol-can11?instant"};
        all.insert(all.end(), rest.begin(), rest.end());
        return all;
    }

    static std::string onTerminal(std::vector<std::string> const& command)
    {
        std::string text = runOnTerminal(arguments(command)).out;
        std::erase(text, '\r');
        std::istringstream lines(text);
        for (std::string line; std::getline(lines, line);) {
            EXPECT_TRUE(charactersOf(line) <= 40 || sortedWords(line).size() == 1) << command.front() << ": " << line;
        }
        return text;
    }
};

TEST_F(NarrowTerminal, KeepsTheWordsOfAReportWhole)
{
    for (std::vector<std::string> const& command :
         {std::vector<std::string>{"info"}, {"codes"}, {"sensors"}, {"readiness"}, {"freeze"}}) {
        Outcome const wide = runVelmora(arguments(command));
        EXPECT_EQ(sortedWords(onTerminal(command)), sortedWords(wide.out)) << command.front();
    }
}

TEST_F(NarrowTerminal, HoldsWhatIsLongest)
{
    for (std::vector<std::string> const& command : {std::vector<std::string>{"scan", "--no-history"}, {"doctor"}}) {
        EXPECT_GT(onTerminal(command).size(), 500U) << command.front();
    }
    EXPECT_EQ(onTerminal({"signals"}), "velmora: A subcommand is required\n"
                                       "  - velmora --help lists the options and\n"
                                       "    commands\n");
}

} // namespace
