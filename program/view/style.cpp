#include "program/view/style.h"

#include "program/terminal/terminal.h"

#include <cstdlib>
#include <unistd.h>

namespace velmora::cli {

namespace {

char const* sequence(Mark mark)
{
    static constexpr char const* sequences[] = {"", "\033[32m", "\033[33m", "\033[31m", "\033[2m"};
    return sequences[static_cast<int>(mark)];
}

} // namespace

std::string Style::paint(Mark mark, std::string const& text) const
{
    return m_coloured && mark != Mark::None ? sequence(mark) + text + "\033[0m" : text;
}

bool wantsColor(std::optional<ColorMode> mode, bool noColor, bool terminal)
{
    switch (mode.value_or(noColor ? ColorMode::Never : ColorMode::Auto)) {
    case ColorMode::Always:
        return true;
    case ColorMode::Never:
        return false;
    case ColorMode::Auto:
        break;
    }
    return terminal && !noColor;
}

Style outputStyle(GlobalOptions const& options)
{
    char const* const noColor = std::getenv("NO_COLOR");
    return Style(wantsColor(options.color, noColor != nullptr && *noColor != '\0', Terminal::isUsable()),
                 options.verbose, Terminal::columnsOf(STDOUT_FILENO));
}

} // namespace velmora::cli
