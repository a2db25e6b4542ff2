#include "libobd/adapter/adapterversion.h"

#include "libobd/adapter/elmtext.h"

#include <charconv>

namespace obd {
namespace {

bool startsWithDigit(std::string const& text)
{
    return !text.empty() && text.front() >= '0' && text.front() <= '9';
}

} // namespace

AdapterVersion parseAdapterVersion(std::string word)
{
    cropWord("v", word);
    removeSpaces(word);
    AdapterVersion version{0, 0};
    if (startsWithDigit(word)) {
        char const* begin = word.data();
        auto const parsed = std::from_chars(begin, begin + word.size(), version.majorNumber);
        word.erase(0, static_cast<std::size_t>(parsed.ptr - begin));
    }
    cropWord(".", word);
    if (startsWithDigit(word)) {
        version.minorNumber = word.front() - '0';
    }
    return version;
}

} // namespace obd
