#pragma once

#include <velmora/caroptions.h>

#include <optional>
#include <string>

namespace velmora::cli {

enum class ColorMode
{
    Auto,
    Always,
    Never,
};

// What the options before the command say, as given: of a car, and of what is shown of it. The settings file fills what
// stays empty.
struct GlobalOptions : CarOptions
{
    bool allEcus = false; // all control modules, where one is the usual
    bool json = false;
    bool yes = false;
    bool quiet = false;
    bool verbose = false;
    std::optional<ColorMode> color;
};

// "auto", "1" to "9", or as adapters print a protocol that they found, "A6": the number that CarOptions has. Nothing
// for any other text.
std::optional<int> parseProtocol(std::string const& text);

// A control module id in hexadecimal, with or without 0x. Nothing for any other text.
std::optional<unsigned int> parseEcuId(std::string const& text);

} // namespace velmora::cli
