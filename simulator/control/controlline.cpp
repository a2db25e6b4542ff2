#include "simulator/control/controlline.h"

#include "simulator/control/controlerror.h"

#include <sstream>

namespace obdsim {

namespace {

std::string withoutBrackets(std::string word)
{
    return word.front() == '[' ? word.substr(1, word.size() - 2) : word;
}

bool isPlaceholder(std::string const& word)
{
    return word.front() >= 'A' && word.front() <= 'Z';
}

bool isOneOf(std::string const& alternatives, std::string const& word)
{
    return ("|" + alternatives + "|").find("|" + word + "|") != std::string::npos &&
           word.find('|') == std::string::npos;
}

std::string wordsOf(std::string alternatives)
{
    for (auto at = alternatives.find('|'); at != std::string::npos; at = alternatives.find('|', at)) {
        alternatives.replace(at, 1, " or ");
    }
    return alternatives;
}

} // namespace

std::vector<std::string> controlWords(std::string const& line)
{
    std::istringstream stream(line);
    std::vector<std::string> words;
    for (std::string word; stream >> word;) {
        words.push_back(word);
    }
    return words;
}

bool isEmptyControlLine(std::string const& line)
{
    auto const first = line.find_first_not_of(" \t\r");
    return first == std::string::npos || line[first] == '#';
}

void checkForm(ControlForm const& form, std::vector<std::string> const& words)
{
    std::vector<std::string> const wanted = controlWords(form.form);
    for (std::size_t i = 1; i < wanted.size(); ++i) {
        bool const optional = wanted[i].front() == '[';
        std::string const want = withoutBrackets(wanted[i]);
        if (i >= words.size()) {
            if (optional) {
                return;
            }
            failAtWord(words, i, wordsOf(want));
        }
        if (!isPlaceholder(want) && !isOneOf(want, words[i])) {
            failAtWord(words, i, wordsOf(want));
        }
        if (want.ends_with("...")) {
            return;
        }
    }
    if (words.size() > wanted.size()) {
        failAtWord(words, wanted.size(), "the end of the line");
    }
}

std::string joinFrom(std::vector<std::string> const& words, std::size_t index)
{
    std::string text;
    for (std::size_t i = index; i < words.size(); ++i) {
        text += (text.empty() ? "" : " ") + words[i];
    }
    return text;
}

void failAtWord(std::vector<std::string> const& words, std::size_t index, std::string const& expected)
{
    std::string const there = index < words.size() ? "is \"" + words[index] + "\"" : "is missing";
    throw ControlError("word " + std::to_string(index + 1) + " " + there + "; here belongs " + expected);
}

} // namespace obdsim
