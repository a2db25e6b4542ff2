#include "tools/manual/commandmodel.h"

#include <CLI/Config.hpp>
#include <CLI/Formatter.hpp>

#include <algorithm>

namespace velmora::manual {

namespace {

// The type's name without what its validators add: "N" of "N:INT in [1 - 6]", all of "KIND:TARGET".
std::string valueName(CLI::Option const& option)
{
    if (option.get_items_expected_max() == 0) {
        return {};
    }
    std::string const type = option.get_type_name();
    bool const validated = type.find_first_of(" {") != std::string::npos;
    return validated ? type.substr(0, type.find_first_of(": ")) : type;
}

// "TEXT:{metric,imperial}" takes these two.
std::vector<std::string> valueWords(CLI::Option const& option)
{
    std::string const type = option.get_type_name();
    std::size_t const open = type.find('{');
    std::size_t const close = type.find('}', open);
    std::vector<std::string> words;
    if (open == std::string::npos || close == std::string::npos) {
        return words;
    }
    for (std::size_t begin = open + 1; begin < close;) {
        std::size_t const end = std::min(type.find(',', begin), close);
        words.push_back(type.substr(begin, end - begin));
        begin = end + 1;
    }
    return words;
}

OptionRow describe(CLI::Option const& option)
{
    OptionRow row;
    row.argument = option.get_positional();
    row.many = option.get_items_expected_max() > 1;
    row.value = valueName(option);
    row.words = valueWords(option);
    row.help = option.get_description();
    row.variable = option.get_envname();
    if (row.argument) {
        row.names = {option.get_name(true)};
        return row;
    }
    for (std::string const& name : option.get_snames()) {
        row.names.push_back("-" + name);
    }
    for (std::string const& name : option.get_lnames()) {
        row.names.push_back("--" + name);
    }
    return row;
}

} // namespace

CommandRow describe(CLI::App const& app)
{
    CommandRow row;
    row.name = app.get_name();
    row.help = app.get_description();
    row.footer = app.get_footer();
    for (CLI::Option const* option : app.get_options()) {
        if (!option->get_group().empty()) {
            row.options.push_back(describe(*option));
        }
    }
    auto const shown = [](CLI::App const* command) { return !command->get_group().empty(); };
    for (CLI::App const* command : app.get_subcommands(shown)) {
        row.commands.push_back(describe(*command));
    }
    return row;
}

OptionRow const* findOption(CommandRow const& command, std::string const& name)
{
    auto const found = std::find_if(command.options.begin(), command.options.end(), [&name](OptionRow const& row) {
        return !row.argument && std::find(row.names.begin(), row.names.end(), name) != row.names.end();
    });
    return found != command.options.end() ? &*found : nullptr;
}

CommandRow const* findCommand(CommandRow const& command, std::string const& name)
{
    auto const found = std::find_if(command.commands.begin(), command.commands.end(),
                                    [&name](CommandRow const& row) { return row.name == name; });
    return found != command.commands.end() ? &*found : nullptr;
}

} // namespace velmora::manual
