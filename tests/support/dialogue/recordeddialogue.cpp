#include "tests/support/dialogue/recordeddialogue.h"

#include <fstream>
#include <stdexcept>
#include <string_view>

namespace support {

namespace {

// The text behind a line's mark: "-> ATZ" has "ATZ", a bare "->" has nothing.
std::string behindMark(std::string const& line)
{
    return line.size() > 3 ? line.substr(3) : std::string();
}

std::string unescaped(std::string const& text)
{
    std::string result;
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (text[i] != '\\') {
            result += text[i];
            continue;
        }
        switch (text.at(++i)) {
        case 'r':
            result += '\r';
            break;
        case 'n':
            result += '\n';
            break;
        case 't':
            result += '\t';
            break;
        case '\\':
            result += '\\';
            break;
        case 'x':
            result += static_cast<char>(std::stoi(text.substr(i + 1, 2), nullptr, 16));
            i += 2;
            break;
        default:
            throw std::runtime_error("unknown escape");
        }
    }
    return result;
}

void readHeaderLine(std::string const& line, RecordedDialogue& dialogue)
{
    std::size_t const colon = line.find(": ");
    if (colon == std::string::npos) {
        throw std::runtime_error("no header line");
    }
    dialogue.header[line.substr(0, colon)] = line.substr(colon + 2);
}

void readDialogueLine(std::string const& line, RecordedDialogue& dialogue)
{
    std::string_view const mark = std::string_view(line).substr(0, 2);
    if (mark == "->") {
        dialogue.exchanges.push_back({unescaped(behindMark(line)), {}});
    } else if (mark == "<-" && !dialogue.exchanges.empty()) {
        dialogue.exchanges.back().reply += unescaped(behindMark(line));
    } else if (mark != "..") {
        throw std::runtime_error("no dialogue line");
    }
}

} // namespace

RecordedDialogue readDialogue(std::filesystem::path const& path)
{
    std::ifstream in(path);
    if (!in) {
        throw std::runtime_error(path.string() + " cannot be read");
    }
    RecordedDialogue dialogue;
    bool inHeader = true;
    for (std::string line; std::getline(in, line);) {
        try {
            if (line.empty()) {
                inHeader = inHeader && dialogue.header.empty();
            } else if (line.front() != '#') {
                inHeader ? readHeaderLine(line, dialogue) : readDialogueLine(line, dialogue);
            }
        } catch (std::exception const& problem) {
            throw std::runtime_error(path.string() + ": " + problem.what() + ": " + line);
        }
    }
    return dialogue;
}

} // namespace support
