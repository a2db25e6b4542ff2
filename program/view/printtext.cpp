#include "program/view/printtext.h"

#include "common/text/layout.h"
#include "program/terminal/output.h"
#include "program/terminal/terminal.h"

#include <fmt/format.h>

#include <unistd.h>

namespace velmora::cli {

void printText(std::string const& text)
{
    fmt::print("{}", folded(text, Terminal::columnsOf(STDOUT_FILENO)));
}

void tellText(std::string const& text)
{
    tell(folded(text, Terminal::columnsOf(STDERR_FILENO)));
}

} // namespace velmora::cli
