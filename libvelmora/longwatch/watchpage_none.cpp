#include "libvelmora/longwatch/watchpage.h"

#include <velmora/error.h>

namespace velmora {

struct WatchPage::Parts
{};

struct WatchPage::Service
{};

WatchPage::WatchPage(std::vector<OutputAddress> const& /*outputs*/, std::string /*vehicle*/,
                     LongWatchOptions const& /*options*/)
{}

WatchPage::~WatchPage() = default;

SessionCarOptions WatchPage::withTaps(SessionCarOptions options) const
{
    return options;
}

std::unique_ptr<IOutput> WatchPage::makeOutput(OutputAddress const& /*address*/, HealthSource /*health*/,
                                               std::filesystem::path const& /*settings*/) const
{
    throw Error(ErrorKind::WrongUse, "This build has no page for browsers", {"velmora --version tells what it has"});
}

void WatchPage::serve(SessionCar& /*car*/, WatchEngine& /*engine*/, WatchEngine::Sink const& /*sink*/) {}

} // namespace velmora
