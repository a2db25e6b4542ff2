// A page in a build without it.
#include <velmora/error.h>
#include <velmora/recording.h>

namespace velmora {

struct PagePlay::Parts
{};

PagePlay::PagePlay(Recording /*recording*/, std::string const& /*address*/, double /*speed*/,
                   std::string const& /*settingsFile*/,
                   std::function<void(std::string const& link, std::string const& remark)> /*onLink*/)
{
    throw Error(ErrorKind::WrongUse, "This build has no page for browsers", {"velmora --version tells what it has"});
}

PagePlay::~PagePlay() = default;

void PagePlay::run() {}

void PagePlay::end() {}

} // namespace velmora
