// The history of a build that keeps none.
#include <velmora/error.h>
#include <velmora/history.h>

namespace velmora {

namespace {

Error noHistory()
{
    return {ErrorKind::WrongUse, "This build keeps no history", {"velmora --version tells what it has"}};
}

} // namespace

struct History::Parts
{};

History::History(Access access) : History(defaultFile(), access) {}

History::History(std::string const& /*file*/, Access /*access*/)
{
    throw noHistory();
}

History::~History() = default;

std::optional<std::int64_t> History::add(KeptScan const& /*scan*/)
{
    throw noHistory();
}

std::vector<KeptScan> History::scans(std::string const& /*vehicle*/) const
{
    throw noHistory();
}

KeptScan History::scan(std::int64_t /*number*/) const
{
    throw noHistory();
}

std::size_t History::forget(std::string const& /*vehicle*/)
{
    throw noHistory();
}

std::size_t History::exportTo(std::ostream& /*out*/) const
{
    throw noHistory();
}

History::Imported History::importFrom(std::istream& /*in*/)
{
    throw noHistory();
}

std::string History::defaultFile()
{
    return {};
}

} // namespace velmora
