#pragma once

#include "tests/program/runline.h"
#include "tests/support/temporaryfolder.h"

#include <gmock/gmock.h>

#include <fstream>
#include <regex>

struct Said
{
    char const* line;
    int code;
    std::string out; // begins with this; empty: nothing is printed
    std::string err; // all of it; one without a line feed at its end is its beginning
};

class CommandRun : public testing::Test
{
protected:
    CommandRun()
    {
        std::string const begin = "name = \"Car\"\nprotocol = 6\n[[module]]\nid = \"7E8\"\nlive = \"0C 0D\"\n";
        std::ofstream(m_folder.file("bare.toml")) << begin;
        std::ofstream(m_folder.file("refusing.toml"))
            << begin
            << "refuses = true\nstored = [\"P0133\"]\nclears_while_running = false\n"
               "[[module.routines]]\nid = \"01\"\nrefusal = \"22\"\n";
        m_settings.set(m_folder.file("settings.toml").c_str());
        m_data.set(m_folder.file("data").c_str());
        m_history.set(m_folder.file("history.db").c_str());
        m_bus.set("unix:path=/nonexistent");
    }

    // @B is a car that has two values and nothing else, @R one that refuses what it can, @F the folder.
    std::vector<std::string> meant(std::string const& line) const
    {
        auto const car = [this](char const* file) { return "-q -p sim:" + m_folder.file(file) + "?instant"; };
        std::string text = std::regex_replace(line, std::regex("@B"), car("bare.toml"));
        text = std::regex_replace(text, std::regex("@R"), car("refusing.toml"));
        return wordsOf(std::regex_replace(text, std::regex("@F"), m_folder.path().string()));
    }

    Ended run(std::string const& line) const { return runLine(meant(line)); }

    void expect(std::vector<Said> const& rows) const
    {
        for (Said const& each : rows) {
            Ended const ended = run(each.line);
            EXPECT_EQ(static_cast<int>(ended.code), each.code) << each.line;
            std::string const err = std::regex_replace(each.err, std::regex("@F"), m_folder.path().string());
            if (err.empty() || err.back() == '\n') {
                EXPECT_EQ(ended.err, err) << each.line;
            } else {
                EXPECT_THAT(ended.err, testing::StartsWith(err)) << each.line;
            }
            EXPECT_THAT(ended.out, testing::StartsWith(each.out)) << each.line;
            EXPECT_TRUE(!each.out.empty() || ended.out.empty()) << each.line << ": " << ended.out;
        }
    }

    testsupport::TemporaryFolder const m_folder;
    Variable const m_settings{"VELMORA_SETTINGS"};
    Variable const m_data{"XDG_DATA_HOME"};
    Variable const m_history{"VELMORA_HISTORY"};
    Variable const m_bus{"DBUS_SYSTEM_BUS_ADDRESS"};
};
