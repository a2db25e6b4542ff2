#include "libobd/adapter/proxyerror.h"

#include "libobd/adapter/elmtext.h"

#include <algorithm>
#include <iterator>
#include <string>
#include <string_view>

namespace obd {
namespace {

struct ErrorWord
{
    std::string_view word; // as it reads without blanks
    ProxyError error;
};

// In the order of search. "ERR" is last, since others hold it.
constexpr ErrorWord errorWords[] = {
    {"NODATA", ProxyError::NoData},         {"UNABLETOCONNECT", ProxyError::UnableToConnect},
    {"BUFFERFULL", ProxyError::BufferFull}, {"BUSBUSY", ProxyError::BusBusy},
    {"BUSERROR", ProxyError::BusError},     {"CANERROR", ProxyError::CanError},
    {"DATAERROR", ProxyError::DataError},   {"FBERROR", ProxyError::FbError},
    {"LVRESET", ProxyError::LvReset},       {"RXERROR", ProxyError::RxError},
    {"STOPPED", ProxyError::Stopped},       {"ERR", ProxyError::GenericError},
};

std::string comparable(std::vector<unsigned char> const& reply)
{
    std::string text = toUpper(std::string(reply.begin(), reply.end()));
    removeSpaces(text);
    cropWord("SEARCHING...", text);
    return text;
}

} // namespace

ProxyError checkForErrors(std::vector<unsigned char> const& reply)
{
    std::string const text = comparable(reply);
    auto const found = std::find_if(std::begin(errorWords), std::end(errorWords),
                                    [&text](ErrorWord const& row) { return hasResponse(text, row.word); });
    return found != std::end(errorWords) ? found->error : ProxyError::None;
}

bool isReplyLost(std::vector<unsigned char> const& reply)
{
    switch (checkForErrors(reply)) {
    case ProxyError::BufferFull:
    case ProxyError::DataError:
    case ProxyError::RxError:
    case ProxyError::Stopped:
    case ProxyError::LvReset:
        return true;
    case ProxyError::GenericError:
        return !hasResponse(comparable(reply), "ERROR"); // so the adapter's own faults by number
    default:
        return false;
    }
}

} // namespace obd
