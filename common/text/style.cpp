#include "common/text/style.h"

namespace velmora {

namespace {

char const* sequence(Mark mark)
{
    static constexpr char const* sequences[] = {"", "\033[32m", "\033[33m", "\033[31m", "\033[2m"};
    return sequences[static_cast<int>(mark)];
}

} // namespace

std::string Style::paint(Mark mark, std::string const& text) const
{
    return m_coloured && mark != Mark::None ? sequence(mark) + text + "\033[0m" : text;
}

} // namespace velmora
