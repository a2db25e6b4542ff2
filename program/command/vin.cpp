#include "libvelmora/report/vinreport.h"
#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/printtext.h"
#include "program/view/style.h"
#include "program/view/vintext.h"

#include <fmt/format.h>

#include <chrono>

namespace velmora::cli {

namespace {

int thisYear()
{
    using namespace std::chrono;
    return static_cast<int>(year_month_day(floor<days>(system_clock::now())).year());
}

ExitCode explainVin(std::string const& text, GlobalOptions const& options)
{
    VinFacts const facts = decodeVin(parseVin(text), thisYear());
    if (options.json) {
        fmt::print("{}", printed(toJsonValue(facts)));
    } else {
        printText(toText(facts, outputStyle(options)));
    }
    return ExitCode::Done;
}

} // namespace

void addVinCommand(CommandLine& commandLine)
{
    auto const text = std::make_shared<std::string>();
    CLI::App* const command =
        commandLine.addCommand("vin", "Tell what a vehicle identification number says; no vehicle needed",
                               [text](GlobalOptions const& options) { return explainVin(*text, options); });
    command->add_option("VIN", *text, "The number, in any case, with or without blanks and hyphens")
        ->type_name("")
        ->required();
}

} // namespace velmora::cli
