#include "simulator/car/services.h"

#include <algorithm>

namespace obdsim {

namespace {

constexpr std::size_t lineData = 4; // data bytes in one numbered message

/// An item of service 09: `data` holds `count` pieces one behind the other.
struct Item
{
    std::uint8_t id;
    std::uint8_t count;
    Bytes data;
};

Bytes characters(std::string const& text)
{
    return {text.begin(), text.end()};
}

Bytes resized(Bytes data, std::size_t size)
{
    data.resize(size, 0);
    return data;
}

/// Numbers stand at the end of their field on the buses without CAN.
Bytes rightAligned(Bytes data, std::size_t size)
{
    data.insert(data.begin(), size > data.size() ? size - data.size() : 0, 0);
    return data;
}

Item numberItem(std::uint8_t id, std::string const& text, bool onCan)
{
    constexpr std::size_t onCanSize = 17;
    constexpr std::size_t onLinesSize = 20;
    Bytes const data = rightAligned(characters(text), onCanSize);
    return {id, 1, onCan ? data : rightAligned(data, onLinesSize)};
}

Item countersItem(std::uint8_t id, std::vector<std::uint16_t> const& counters)
{
    Item item{id, static_cast<std::uint8_t>(counters.size()), {}};
    for (auto const counter : counters) {
        item.data.push_back(static_cast<std::uint8_t>(counter >> 8));
        item.data.push_back(static_cast<std::uint8_t>(counter & 0xFF));
    }
    return item;
}

Item calibrationsItem(std::vector<std::string> const& calibrations)
{
    constexpr std::size_t size = 16;
    Item item{0x04, static_cast<std::uint8_t>(calibrations.size()), {}};
    for (auto const& calibration : calibrations) {
        Bytes const data = resized(characters(calibration), size);
        item.data.insert(item.data.end(), data.begin(), data.end());
    }
    return item;
}

Item verificationsItem(std::vector<Bytes> const& verifications)
{
    Item item{0x06, static_cast<std::uint8_t>(verifications.size()), {}};
    for (auto const& verification : verifications) {
        item.data.insert(item.data.end(), verification.begin(), verification.end());
    }
    return item;
}

std::vector<Item> itemsOf(VehicleInfo const& info, bool onCan)
{
    constexpr std::size_t nameSize = 20;
    std::vector<Item> items = {
        numberItem(0x02, info.vin, onCan),
        calibrationsItem(info.calibrations),
        verificationsItem(info.verifications),
        countersItem(0x08, info.sparkCounters),
        {0x0A, 1, resized(characters(info.ecuName), nameSize)},
        countersItem(0x0B, info.compressionCounters),
        numberItem(0x0D, info.serial, onCan),
        numberItem(0x0F, info.typeApproval, onCan),
    };
    auto const isEmpty = [](Item const& item) {
        return std::all_of(item.data.begin(), item.data.end(), [](std::uint8_t byte) { return byte == 0; });
    };
    items.erase(std::remove_if(items.begin(), items.end(), isEmpty), items.end());
    return items;
}

std::size_t lineCount(Item const& item)
{
    return (item.data.size() + lineData - 1) / lineData;
}

/// Off CAN the odd id before an item tells how many messages it takes.
bool hasCountItem(Item const& item)
{
    return item.id <= 0x0A;
}

std::set<std::uint8_t> ids(std::vector<Item> const& items, bool onCan)
{
    std::set<std::uint8_t> result;
    for (auto const& item : items) {
        result.insert(item.id);
        if (!onCan && hasCountItem(item)) {
            result.insert(static_cast<std::uint8_t>(item.id - 1));
        }
    }
    return result;
}

Answer tellItem(ServiceCall const& call, Item const& item)
{
    Bytes const head = {call.positiveService(), item.id};
    if (call.onCan()) {
        Bytes message = head;
        message.push_back(item.count);
        message.insert(message.end(), item.data.begin(), item.data.end());
        return {0, {message}};
    }
    Answer answer;
    Bytes const data = resized(item.data, lineCount(item) * lineData);
    for (std::size_t line = 0; line < lineCount(item); ++line) {
        Bytes message = head;
        message.push_back(static_cast<std::uint8_t>(line + 1));
        auto const from = data.begin() + static_cast<std::ptrdiff_t>(line * lineData);
        message.insert(message.end(), from, from + static_cast<std::ptrdiff_t>(lineData));
        answer.messages.push_back(message);
    }
    return answer;
}

Answer tellLineCount(ServiceCall const& call, Item const& item)
{
    auto const service = call.positiveService();
    return {0, {{service, static_cast<std::uint8_t>(item.id - 1), static_cast<std::uint8_t>(lineCount(item))}}};
}

} // namespace

Answer vehicleInformation(ServiceCall const& call)
{
    auto const id = call.at(1);
    if (!id) {
        return {};
    }
    auto const items = itemsOf(call.module.data().info, call.onCan());
    if (isRangeRequest(*id)) {
        return tellRange(call, ids(items, call.onCan()));
    }
    for (auto const& item : items) {
        if (item.id == *id) {
            return tellItem(call, item);
        }
        if (!call.onCan() && hasCountItem(item) && item.id - 1 == *id) {
            return tellLineCount(call, item);
        }
    }
    return {};
}

bool hasVehicleInformation(ModuleData const& data)
{
    return !itemsOf(data.info, true).empty();
}

} // namespace obdsim
