#include "simulator/dialogue.h"

#include "simulator/bytes.h"
#include "simulator/dialogueheaders.h"

#include <numeric>
#include <utility>

namespace obdsim {

namespace {

/// Escapes what a text file cannot hold; blanks at the ends, which editors cut.
std::string escape(std::string const& bytes)
{
    std::string text;
    for (std::size_t i = 0; i < bytes.size(); ++i) {
        char const character = bytes[i];
        bool const atEnd = i == 0 || i + 1 == bytes.size();
        switch (character) {
        case '\r':
            text += "\\r";
            break;
        case '\n':
            text += "\\n";
            break;
        case '\t':
            text += "\\t";
            break;
        case '\\':
            text += "\\\\";
            break;
        default:
            bool const plain = character > ' ' && character < '\x7F';
            bool const blank = character == ' ' && !atEnd;
            text += plain || blank ? std::string(1, character) : "\\x" + hexByte(static_cast<std::uint8_t>(character));
        }
    }
    return text;
}

/// One "<-" line for each line of a reply; the prompt stays with the last.
std::string receivedLines(std::string const& bytes)
{
    std::string text;
    std::size_t from = 0;
    while (from < bytes.size()) {
        auto end = bytes.find_first_not_of("\r\n>", from);
        end = end == std::string::npos ? bytes.size() : bytes.find_first_of("\r\n>", end);
        end = end == std::string::npos ? bytes.size() : bytes.find_first_not_of("\r\n>", end);
        end = end == std::string::npos ? bytes.size() : end;
        text += "<- " + escape(bytes.substr(from, end - from)) + "\n";
        from = end;
    }
    return text;
}

std::string headerText(Dialogue const& dialogue)
{
    std::string text = "vehicle: " + dialogue.vehicle + "\nadapter: " + dialogue.adapter +
                       "\nprotocol: " + std::to_string(dialogue.protocol) + "\n";
    for (auto const& row : headersNames) {
        text += row.value == dialogue.headers ? std::string("headers: ") + row.name + "\n" : "";
    }
    return text + (dialogue.raw ? "raw: yes\n" : "");
}

} // namespace

std::string Exchange::received() const
{
    return std::accumulate(chunks.begin(), chunks.end(), std::string(),
                           [](std::string all, DialogueChunk const& chunk) { return std::move(all) + chunk.bytes; });
}

std::string formatDialogue(Dialogue const& dialogue, std::vector<std::string> const& comment)
{
    std::string text;
    for (auto const& line : comment) {
        text += "# " + line + "\n";
    }
    text += headerText(dialogue) + "\n";
    for (auto const& exchange : dialogue.exchanges) {
        text += exchange.sent.empty() ? "->\n" : "-> " + escape(exchange.sent) + "\n";
        for (auto const& chunk : exchange.chunks) {
            text += chunk.pause == Time(0)
                        ? ""
                        : ".. " + std::to_string(std::chrono::duration_cast<Ms>(chunk.pause).count()) + "\n";
            text += receivedLines(chunk.bytes);
        }
    }
    return text;
}

} // namespace obdsim
