#pragma once

#include <filesystem>
#include <map>
#include <string>

namespace velmora {

// Where an output goes, as people write it: KIND:TARGET?key=value&key=value, or mqtt://HOST:PORT/TOPIC.
struct OutputAddress
{
    std::string kind;                           // "csv", "mqtts", ...
    std::string target;                         // a file, or what stands behind mqtt://
    std::map<std::string, std::string> options; // each of them one that the kind knows

    // The value of a key, or that for a key which was not given.
    std::string option(std::string const& key, std::string const& otherwise = "") const;
};

// Throws Error that tells what is wrong. Passwords are no options, so the text may be shown.
OutputAddress parseOutputAddress(std::string const& text);

// The address of a file, whatever characters its path has. Throws Error for a kind that writes no files.
OutputAddress fileOutput(std::string const& kind, std::filesystem::path const& file);

// Adds one more option. Throws Error if the kind does not know it.
void addOption(OutputAddress& address, std::string const& key, std::string const& value);

// "csv:drive.csv", without options: how messages call it.
std::string toString(OutputAddress const& address);

// Throws Error for an output to a file whose target stands and is no plain one: a pipe would hold it up, a device keeps
// nothing.
void requirePlainTarget(OutputAddress const& address);

// A number of bytes: "500", "10k", "10MB", "1G". Throws Error for anything else and for 0.
unsigned long long parseSize(std::string const& text);

} // namespace velmora
