// The history of a build that keeps none.
#include <velmora/error.h>
#include <velmora/history.h>

namespace velmora {

namespace {

[[noreturn]] void refuseHistory()
{
    throw Error(ErrorKind::WrongUse, "This build keeps no history", {"velmora --version tells what it has"});
}

} // namespace

struct History::Parts
{};

History::History(Access access) : History(defaultFile(), access) {}

History::History(std::string const& /*file*/, Access /*access*/)
{
    refuseHistory();
}

History::~History() = default;

std::optional<std::int64_t> History::add(KeptScan const& /*scan*/)
{
    refuseHistory();
}

std::vector<KeptScan> History::scans(std::string const& /*vehicle*/) const
{
    refuseHistory();
}

KeptScan History::scan(std::int64_t /*number*/) const
{
    refuseHistory();
}

std::size_t History::forget(std::string const& /*vehicle*/)
{
    refuseHistory();
}

std::size_t History::exportTo(std::ostream& /*out*/) const
{
    refuseHistory();
}

History::Imported History::importFrom(std::istream& /*in*/)
{
    refuseHistory();
}

std::string History::defaultFile()
{
    return {};
}

} // namespace velmora
