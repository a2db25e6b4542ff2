#pragma once

#include <CLI/App.hpp>
#include <CLI/Formatter.hpp>

#include <string>

namespace velmora::cli {

// Help that names what an option takes and leaves out how it is checked: "N", not "N:INT in [1 - 6]". The description
// tells the range where it matters, and so does the error.
class HelpFormatter : public CLI::Formatter
{
public:
    std::string make_option_opts(CLI::Option const* option) const override;
};

} // namespace velmora::cli
