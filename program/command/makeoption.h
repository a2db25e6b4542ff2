#pragma once

#include <CLI/App.hpp>

#include <string>

namespace velmora::cli {

// Adds --make, by which trouble codes get the meanings of that maker. maker must live as long as the command; what is
// written there is the catalogue's way of writing it. A maker that the catalogue does not have is wrong use.
void addMakeOption(CLI::App& command, std::string& maker);

} // namespace velmora::cli
