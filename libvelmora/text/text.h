#pragma once

// The companion's texts are those that all of the house share.
#include "common/text/text.h" // IWYU pragma: export
