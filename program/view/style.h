#pragma once

#include "common/text/style.h"
#include "program/globaloptions.h"

#include <velmora/print.h>

namespace velmora::cli {

// Whether to use colours. What the user chose for this run comes before noColor, the wish for none in all programs;
// left alone, a terminal gets colours.
bool wantsColor(std::optional<ColorMode> mode, bool noColor, bool terminal);

// The style of standard output.
Style outputStyle(GlobalOptions const& options);
// The same for texts that the companion makes.
TextStyle textStyle(GlobalOptions const& options);

} // namespace velmora::cli
