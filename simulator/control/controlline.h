#pragma once

#include <string>
#include <vector>

namespace obdsim {

/// The words of a control line, split at blanks and tabs.
std::vector<std::string> controlWords(std::string const& line);

/// Nothing but blanks, or a comment that begins with #.
bool isEmptyControlLine(std::string const& line);

/// One control command by its form: small words stand for themselves, alternatives are divided by "|", words in
/// capitals stand for what the host writes, the last one may be "..." for the rest of the line, and what is in brackets
/// may be left out.
struct ControlForm
{
    char const* form; ///< "module MODULE silent|speaks"
    char const* help;
};

/// Whether the words fit the form; throws ControlError, which names the first word that does not. The first word must
/// be that of the form.
void checkForm(ControlForm const& form, std::vector<std::string> const& words);

/// The words from `index` on, with a blank between them.
std::string joinFrom(std::vector<std::string> const& words, std::size_t index);

/// Throws the ControlError for word `index`.
[[noreturn]] void failAtWord(std::vector<std::string> const& words, std::size_t index, std::string const& expected);

} // namespace obdsim
