#include "simulator/adapter/quirk.h"

#include <algorithm>
#include <iterator>

namespace obdsim {

namespace {

constexpr std::string_view names[] = {
    "prompt-late",
    "prompt-slow",
    "single-return",
    "double-prompt",
    "linefeeds-on",
    "junk-before-banner",
    "question-before-banner",
    "leftover-questions",
    "stopped-first",
    "greeting",
    "headers-stuck",
    "echo-stuck",
    "echo-kept-off",
    "padding-shown",
    "formatting-stuck",
    "ok-to-all",
    "first-letters-only",
    "no-count-digit",
    "pieces",
    "byte-per-line",
    "search-ok",
    "bus-init-split",
    "init-without-dots",
    "tight-description",
    "first-no-data",
    "frames-twice",
    "padding-cut",
    "count-messages",
    "count-ignored",
    "request-cut",
    "first-swallowed",
    "first-prompt-lost",
};
static_assert(std::size(names) == quirkCount);
static_assert(static_cast<std::size_t>(Quirk::FirstPromptLost) + 1 == quirkCount);

std::uint64_t bit(Quirk quirk)
{
    return std::uint64_t{1} << static_cast<unsigned int>(quirk);
}

} // namespace

Quirks::Quirks(std::initializer_list<Quirk> quirks)
{
    for (auto const quirk : quirks) {
        add(quirk);
    }
}

void Quirks::add(Quirk quirk)
{
    m_bits |= bit(quirk);
}

void Quirks::add(Quirks const& others)
{
    m_bits |= others.m_bits;
}

bool Quirks::has(Quirk quirk) const
{
    return (m_bits & bit(quirk)) != 0;
}

std::optional<Quirk> findQuirk(std::string_view name)
{
    auto const found = std::find(std::begin(names), std::end(names), name);
    if (found == std::end(names)) {
        return std::nullopt;
    }
    return static_cast<Quirk>(std::distance(std::begin(names), found));
}

std::vector<std::string> quirkNames()
{
    return {std::begin(names), std::end(names)};
}

} // namespace obdsim
