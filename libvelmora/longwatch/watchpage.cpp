#include "libvelmora/longwatch/watchpage.h"

#include "libvelmora/dash/dashclerk.h"
#include "libvelmora/dash/dashoutput.h"

#include <algorithm>

namespace velmora {

namespace {

// Links stay good when the settings are read again or another vehicle answers.
std::string const& processToken()
{
    static std::string const token = makeToken();
    return token;
}

} // namespace

struct WatchPage::Parts
{
    std::string vehicle;
    bool forPage = false;
    bool outputIsFree = true;
    std::function<void(PageLink const&)> onPage;
    std::shared_ptr<DashDesk> desk = std::make_shared<DashDesk>();
};

struct WatchPage::Service
{
    DashClerk clerk;
};

WatchPage::WatchPage(std::vector<OutputAddress> const& outputs, std::string vehicle, LongWatchOptions const& options)
{
    if (std::ranges::any_of(outputs, is)) {
        m_parts = std::make_shared<Parts>();
        m_parts->vehicle = std::move(vehicle);
        m_parts->forPage = options.forPage;
        m_parts->onPage = options.onPage;
        m_parts->outputIsFree =
            std::ranges::none_of(outputs, [](OutputAddress const& each) { return each.target == "-"; });
    }
}

WatchPage::~WatchPage() = default;

SessionCarOptions WatchPage::withTaps(SessionCarOptions options) const
{
    if (m_parts != nullptr) {
        std::shared_ptr<DashDesk> const desk = m_parts->desk;
        options.onReading = [desk](Reading const& reading) { desk->tell(reading); };
        options.onTraffic = [desk](bool sent, std::string_view text) {
            desk->tell(DashLine{std::chrono::system_clock::now(), sent, std::string(text)});
        };
    }
    return options;
}

std::unique_ptr<IOutput> WatchPage::makeOutput(OutputAddress const& address, HealthSource health,
                                               std::filesystem::path const& settings) const
{
    DashContext context;
    context.desk = m_parts->desk;
    context.health = std::move(health);
    context.layouts = DashLayouts::besides(settings);
    context.settings = settings;
    context.token = processToken();
    context.mustListen = m_parts->forPage;
    context.onLink = [parts = m_parts](std::string const& link, std::string const& remark) {
        if (parts->onPage) {
            parts->onPage({link, remark, parts->outputIsFree});
        }
    };
    return std::make_unique<DashOutput>(address, std::move(context));
}

void WatchPage::serve(SessionCar& car, WatchEngine& engine, WatchEngine::Sink const& sink)
{
    if (m_parts == nullptr) {
        return;
    }
    if (m_service == nullptr) {
        m_service = std::make_unique<Service>(Service{DashClerk(car, *m_parts->desk, m_parts->vehicle)});
    }
    DashClerk::Outcome const outcome = m_service->clerk.serve();
    if (outcome.sensors) {
        sink(car.sensors());
    }
    if (outcome.cleared) {
        engine.lookAtCodesSoon();
    }
}

} // namespace velmora
