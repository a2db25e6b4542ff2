#pragma once

#include "tools/manual/commandmodel.h"

#include <functional>
#include <map>
#include <string>
#include <vector>

namespace velmora::manual {

// A word that may stand on the command line.
struct Candidate
{
    std::string word;
    std::string help;
};

// What a shell is to offer for the last word.
struct Completion
{
    std::vector<Candidate> candidates;
    bool files = false; // names of files
};

// What values there are, by the name of what an option takes or of an argument: "PORT", "SENSOR". It gets the word so
// far.
using Sources = std::map<std::string, std::function<Completion(std::string const& begun)>>;

// The candidates for the last of these words, which may be empty; they begin with it, in any letter case.
Completion complete(CommandRow const& program, Sources const& sources, std::vector<std::string> const& words);

// As shells read it: "word<TAB>help" on a line each, or ":files" alone.
std::string printed(Completion const& completion);

} // namespace velmora::manual
