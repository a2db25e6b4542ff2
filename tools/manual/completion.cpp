#include "tools/manual/completion.h"

#include <algorithm>
#include <cctype>

namespace velmora::manual {

namespace {

bool beginsWith(std::string const& word, std::string const& begun)
{
    return word.size() >= begun.size() && std::equal(begun.begin(), begun.end(), word.begin(), [](char a, char b) {
               return std::toupper(static_cast<unsigned char>(a)) == std::toupper(static_cast<unsigned char>(b));
           });
}

// The first line: what follows is for those who read the whole help.
std::string firstLine(std::string const& text)
{
    return text.substr(0, text.find('\n'));
}

// Where on the command line the last word stands.
struct Place
{
    std::vector<CommandRow const*> commands; // from the program on
    OptionRow const* option = nullptr;       // whose value is wanted
};

OptionRow const* optionOf(Place const& place, std::string const& name)
{
    for (auto command = place.commands.rbegin(); command != place.commands.rend(); ++command) {
        if (OptionRow const* const option = findOption(**command, name)) {
            return option;
        }
    }
    return nullptr;
}

Place placeOf(CommandRow const& program, std::vector<std::string> const& words)
{
    Place place{{&program}, nullptr};
    for (std::size_t index = 0; index + 1 < words.size(); ++index) {
        std::string const& word = words[index];
        if (place.option != nullptr) {
            place.option = nullptr; // this word is its value
        } else if (word.starts_with("-")) {
            OptionRow const* const option = optionOf(place, word);
            place.option = option != nullptr && !option->value.empty() ? option : nullptr;
        } else if (CommandRow const* const command = findCommand(*place.commands.back(), word)) {
            place.commands.push_back(command);
        }
    }
    return place;
}

Completion valuesOf(OptionRow const& option, Sources const& sources, std::string const& begun)
{
    if (!option.words.empty()) {
        Completion completion;
        for (std::string const& word : option.words) {
            completion.candidates.push_back({word, {}});
        }
        return completion;
    }
    for (std::string const& name : {option.names.back(), option.value}) {
        if (auto const source = sources.find(name); source != sources.end()) {
            return source->second(begun);
        }
    }
    return {};
}

Completion optionsAt(Place const& place)
{
    Completion completion;
    for (auto command = place.commands.rbegin(); command != place.commands.rend(); ++command) {
        for (OptionRow const& option : (*command)->options) {
            for (std::string const& name : option.names) {
                bool const known = std::any_of(completion.candidates.begin(), completion.candidates.end(),
                                               [&name](Candidate const& each) { return each.word == name; });
                if (!option.argument && !known) {
                    completion.candidates.push_back({name, firstLine(option.help)});
                }
            }
        }
    }
    return completion;
}

Completion wordsAt(Place const& place, Sources const& sources, std::string const& begun)
{
    Completion completion;
    CommandRow const& command = *place.commands.back();
    for (CommandRow const& each : command.commands) {
        completion.candidates.push_back({each.name, firstLine(each.help)});
    }
    for (OptionRow const& option : command.options) {
        if (option.argument) {
            Completion const values = valuesOf(option, sources, begun);
            completion.candidates.insert(completion.candidates.end(), values.candidates.begin(),
                                         values.candidates.end());
            completion.files = completion.files || values.files;
        }
    }
    return completion;
}

Completion keepBegun(Completion completion, std::string const& begun)
{
    std::erase_if(completion.candidates,
                  [&begun](Candidate const& candidate) { return !beginsWith(candidate.word, begun); });
    return completion;
}

} // namespace

Completion complete(CommandRow const& program, Sources const& sources, std::vector<std::string> const& words)
{
    std::string const begun = words.empty() ? std::string() : words.back();
    Place const place = placeOf(program, words);
    if (place.option != nullptr) {
        return keepBegun(valuesOf(*place.option, sources, begun), begun);
    }
    std::size_t const equals = begun.find('=');
    if (begun.starts_with("--") && equals != std::string::npos) {
        OptionRow const* const option = optionOf(place, begun.substr(0, equals));
        Completion values;
        if (option != nullptr && !option->value.empty()) {
            values = valuesOf(*option, sources, begun.substr(equals + 1));
        }
        for (Candidate& candidate : values.candidates) {
            candidate.word.insert(0, begun.substr(0, equals + 1));
        }
        return keepBegun(values, begun);
    }
    if (begun.starts_with("-")) {
        return keepBegun(optionsAt(place), begun);
    }
    return keepBegun(wordsAt(place, sources, begun), begun);
}

std::string printed(Completion const& completion)
{
    if (completion.files && completion.candidates.empty()) {
        return ":files\n";
    }
    std::string text;
    for (Candidate const& candidate : completion.candidates) {
        text += candidate.word + (candidate.help.empty() ? "" : "\t" + candidate.help) + "\n";
    }
    return text;
}

} // namespace velmora::manual
