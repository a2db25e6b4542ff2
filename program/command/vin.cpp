#include "program/command/commands.h"
#include "program/commandline.h"
#include "program/terminal/output.h"
#include "program/view/printtext.h"
#include "program/view/style.h"

#include <velmora/print.h>
#include <velmora/vin.h>

#include <fmt/format.h>

namespace velmora::cli {

namespace {

ExitCode tellOfVin(std::string const& text, GlobalOptions const& options)
{
    VinFacts const facts = explainVin(text);
    if (options.json) {
        fmt::print("{}", toJson(facts));
    } else {
        printText(toText(facts, textStyle(options)));
    }
    return ExitCode::Done;
}

} // namespace

void addVinCommand(CommandLine& commandLine)
{
    auto const text = std::make_shared<std::string>();
    CLI::App* const command =
        commandLine.addCommand("vin", "Tell what a vehicle identification number says; no vehicle needed",
                               [text](GlobalOptions const& options) { return tellOfVin(*text, options); });
    command->add_option("VIN", *text, "The number, in any case, with or without blanks and hyphens")
        ->type_name("")
        ->required();
}

} // namespace velmora::cli
