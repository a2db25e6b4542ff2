#include "program/helpformatter.h"

namespace velmora::cli {

namespace {

// Of "N:INT in [1 - 6]" the name that was given; of a kind that CLI11 found by itself one for people.
std::string namedType(std::string type)
{
    for (char const* check : {":INT in ", ":UINT in ", ":FLOAT in ", ":{"}) {
        type.erase(std::min(type.find(check), type.size()));
    }
    if (type == "TEXT") {
        return {};
    }
    return type == "INT" || type == "UINT" || type == "FLOAT" ? "N" : type;
}

} // namespace

std::string HelpFormatter::make_option_opts(CLI::Option const* option) const
{
    std::string text;
    std::string const type = option->get_type_size() != 0 ? namedType(option->get_type_name()) : std::string();
    text += type.empty() ? "" : " " + type;
    text += option->get_default_str().empty() ? "" : " (" + option->get_default_str() + ")";
    text += option->get_expected_max() == CLI::detail::expected_max_vector_size ? " ..." : "";
    text += option->get_envname().empty() ? "" : " (Env:" + option->get_envname() + ")";
    return text;
}

} // namespace velmora::cli
