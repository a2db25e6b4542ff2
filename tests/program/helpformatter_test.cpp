#include "program/helpformatter.h"

#include <CLI/CLI.hpp>
#include <gtest/gtest.h>

namespace {

TEST(HelpFormatter, NamesWhatAnOptionTakesAndNotHowItIsChecked)
{
    CLI::App app("words", "name");
    app.formatter(std::make_shared<velmora::cli::HelpFormatter>());
    CLI::App* const command = app.add_subcommand("live", "more words");
    int frame = 0;
    double rate = 0.0;
    std::string kind;
    std::string listen = "tcp://x";
    std::vector<std::string> sensors;
    unsigned int plain = 0;
    command->add_option("--frame", frame, "Frame")->type_name("N")->check(CLI::Range(0, 255));
    command->add_option("--rate", rate, "Rate")->type_name("HZ")->check(CLI::Range(0.1, 1e9));
    command->add_option("--kind", kind, "Kind")->type_name("none|full")->check(CLI::IsMember({"none", "full"}));
    command->add_option("--output", kind, "Output")->type_name("KIND:TARGET");
    command->add_option("--listen", listen, "Listen")->type_name("ADDRESS")->capture_default_str();
    command->add_option("--plain", plain, "Plain");
    command->add_option("--port", kind, "Port")->type_name("PORT")->envname("HELP_PORT");
    command->add_option("SENSOR", sensors, "Sensors")->required();
    std::string const help = command->help();
    for (char const* line :
         {"--frame N ", "--rate HZ ", "--kind none|full ", "--output KIND:TARGET ", "--listen ADDRESS (tcp://x)",
          "--plain N ", "--port PORT (Env:HELP_PORT)", "SENSOR ... "}) {
        EXPECT_NE(help.find(line), std::string::npos) << line << "\n" << help;
    }
    for (char const* word : {" in [", "INT", "TEXT", "FLOAT", "REQUIRED"}) {
        EXPECT_EQ(help.find(word), std::string::npos) << word << "\n" << help;
    }
}

} // namespace
