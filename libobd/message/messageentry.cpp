#include "libobd/message/messageentry.h"

#include "libobd/bytes/bytes.h"

#include <common/clock.h>
#include <common/localtime.h>

#include <iomanip>
#include <sstream>

namespace obd {
namespace {

std::string localTimeOfDay()
{
    std::tm const now = tervex::toLocalTime(tervex::clock().wallSeconds());
    std::ostringstream text;
    text.imbue(std::locale::classic());
    text << std::setfill('0') << std::setw(2) << now.tm_hour << ":" << std::setw(2) << now.tm_min << ":" << std::setw(2)
         << now.tm_sec;
    return text.str();
}

} // namespace

std::shared_ptr<MessageDataModel> makeMessageEntry(std::vector<unsigned char> const& bytes, int direction)
{
    std::vector<unsigned char> text = bytes;
    removeBytes(text, lineFraming);
    auto entry = std::make_shared<MessageDataModel>();
    entry->time = localTimeOfDay();
    entry->direction = direction;
    entry->data.assign(text.begin(), text.end());
    return entry;
}

} // namespace obd
