#include "program/view/style.h"

#include "program/terminal/terminal.h"

#include <cstdlib>
#include <unistd.h>

namespace velmora::cli {

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

TextStyle textStyle(GlobalOptions const& options)
{
    Style const style = outputStyle(options);
    return {style.isColoured(), style.isDetailed(), style.columns()};
}

} // namespace velmora::cli
