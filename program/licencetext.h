#pragma once

namespace velmora::cli {

// Our licence, and the notices of what the build may contain: the files LICENSE and THIRD-PARTY-NOTICES.
extern char const* const licenceText;

} // namespace velmora::cli
