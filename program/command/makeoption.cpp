#include "program/command/makeoption.h"

#include <velmora/catalogue.h>

namespace velmora::cli {

void addMakeOption(CLI::App& command, std::string& maker)
{
    command
        .add_option_function<std::string>(
            "--make", [&maker](std::string const& name) { maker = findMaker(name); },
            "Whose meanings maker-specific codes have, such as Ford (by the VIN)")
        ->type_name("MAKER");
}

} // namespace velmora::cli
