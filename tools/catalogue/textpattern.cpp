#include "tools/catalogue/textpattern.h"

#include "tools/catalogue/sourceerror.h"
#include "tools/catalogue/trim.h"

#include <algorithm>
#include <charconv>
#include <optional>

namespace catalogue {

namespace {

// One stretch of a pattern: plain text is a single alternative.
using Alternatives = std::vector<std::string>;

// A bound that no real family reaches; it keeps a slip such as {1-999999999} from filling the memory.
constexpr unsigned int maximumNumber = 255;

std::optional<unsigned int> parseNumber(std::string_view text)
{
    unsigned int number = 0;
    auto const [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    if (error != std::errc() || end != text.data() + text.size() || number > maximumNumber) {
        return std::nullopt;
    }
    return number;
}

bool isLetter(std::string_view text)
{
    return text.size() == 1 && text.front() >= 'A' && text.front() <= 'Z';
}

// The alternatives of "1-4" or "A-F"; nothing when the group is no range.
std::optional<Alternatives> expandRange(std::string_view group)
{
    std::size_t const dash = group.find('-');
    if (dash == std::string_view::npos) {
        return std::nullopt;
    }
    std::string_view const first = group.substr(0, dash);
    std::string_view const last = group.substr(dash + 1);
    Alternatives entries;
    if (auto const from = parseNumber(first), to = parseNumber(last); from && to) {
        for (unsigned int number = *from; number <= *to; ++number) {
            entries.push_back(std::to_string(number));
        }
    } else if (isLetter(first) && isLetter(last)) {
        for (char letter = first.front(); letter <= last.front(); ++letter) {
            entries.emplace_back(1, letter);
        }
    } else {
        return std::nullopt;
    }
    if (entries.size() < 2) {
        throw SourceError("the range '{" + std::string(group) + "}' does not rise");
    }
    return entries;
}

Alternatives expandGroup(std::string_view group, Lists const& lists)
{
    if (auto range = expandRange(group)) {
        return *range;
    }
    if (group.find('|') != std::string_view::npos) {
        return splitAlternatives(group);
    }
    auto const list = lists.find(group);
    if (list == lists.end()) {
        throw SourceError("'{" + std::string(group) + "}' is no range, no choice and no known list");
    }
    return list->second;
}

// Cuts a pattern into plain stretches and groups.
std::vector<Alternatives> splitPattern(std::string_view pattern, Lists const& lists)
{
    std::vector<Alternatives> parts;
    while (!pattern.empty()) {
        std::size_t const open = pattern.find_first_of("{}");
        if (open != 0) {
            parts.push_back({std::string(pattern.substr(0, open))});
        }
        if (open == std::string_view::npos) {
            break;
        }
        std::size_t const close = pattern.find_first_of("{}", open + 1);
        if (pattern[open] != '{' || close == std::string_view::npos || pattern[close] != '}') {
            throw SourceError("a brace of the family is not closed or not opened");
        }
        parts.push_back(expandGroup(pattern.substr(open + 1, close - open - 1), lists));
        pattern.remove_prefix(close + 1);
    }
    return parts;
}

} // namespace

std::vector<std::string> splitAlternatives(std::string_view text)
{
    std::vector<std::string> entries;
    for (std::size_t start = 0; start <= text.size();) {
        std::size_t const bar = std::min(text.find('|', start), text.size());
        entries.emplace_back(trim(text.substr(start, bar - start)));
        if (entries.back().empty()) {
            throw SourceError("an entry between bars is empty");
        }
        start = bar + 1;
    }
    return entries;
}

std::vector<std::string> expandText(std::string_view pattern, std::size_t count, Lists const& lists)
{
    std::vector<Alternatives> const parts = splitPattern(pattern, lists);
    if (pattern.find('{') == std::string_view::npos) {
        return std::vector<std::string>(count, std::string(pattern));
    }
    std::vector<std::string> texts(1);
    for (Alternatives const& part : parts) {
        std::vector<std::string> longer;
        for (std::string const& text : texts) {
            for (std::string const& entry : part) {
                longer.push_back(text + entry);
            }
        }
        texts = std::move(longer);
        if (texts.size() > count) {
            break;
        }
    }
    if (texts.size() != count) {
        std::string const amount = texts.size() > count ? "more" : "only " + std::to_string(texts.size());
        throw SourceError("the family has " + std::to_string(count) + " codes but " + amount + " texts");
    }
    return texts;
}

} // namespace catalogue
