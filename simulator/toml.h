#pragma once

// The reader of TOML asserts what a broken file can bring about, such as "[%]"; without the assertion it tells the
// file's mistake as it should.
#define TOML_ASSERT(expr) static_assert(true)

#include <toml++/toml.h>
