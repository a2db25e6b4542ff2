#pragma once

#include <filesystem>
#include <map>
#include <string>
#include <vector>

namespace support {

// One line that was sent and the bytes that came back, pauses between them left out.
struct Exchange
{
    std::string request; // without its carriage return
    std::string reply;   // every byte, line ends and prompts included
};

// A recorded dialogue with an adapter.
struct RecordedDialogue
{
    std::map<std::string, std::string> header; // such as "protocol" and "headers"
    std::vector<Exchange> exchanges;
};

// Throws std::runtime_error, with the line, on a file that is not in the form of tests/dialogues.
RecordedDialogue readDialogue(std::filesystem::path const& path);

} // namespace support
