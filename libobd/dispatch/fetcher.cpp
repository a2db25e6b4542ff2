#include "libobd/dispatch/fetcher.h"

#include "libobd/bytes/bytes.h"

#include <obd/iecu.h>

#include <limits>

namespace obd {
namespace {

constexpr std::chrono::milliseconds queueMargin{50};

} // namespace

Verdict judgeFetch(FetchEnd end, IQuery const& query, IEcu const& ecu)
{
    if (end == FetchEnd::Dropped) {
        return {OutcomeKind::NotConnected};
    }
    if (end == FetchEnd::Late) {
        return {OutcomeKind::ModuleSilent}; // the query is not to be touched
    }
    Verdict const verdict = query.verdict(ecu);
    if (end == FetchEnd::Failed) {
        return verdict.kind != OutcomeKind::Answered ? verdict : Verdict{OutcomeKind::ModuleSilent};
    }
    if (verdict.kind != OutcomeKind::Answered) {
        TERVEX_LOG(Error) << "Nothing usable of ECU 0x" << lowerHex(ecu.id());
    }
    return verdict;
}

std::chrono::milliseconds fetchLimit(unsigned int timeoutMs)
{
    bool const negative = timeoutMs > static_cast<unsigned int>(std::numeric_limits<int>::max());
    return std::chrono::milliseconds(negative ? 0 : timeoutMs) + queueMargin;
}

} // namespace obd
