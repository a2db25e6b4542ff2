#include "libvelmora/channel/requestaddress.h"

#include <algorithm>
#include <iterator>

namespace velmora {

namespace {

constexpr int pwmProtocol = 1;
constexpr double addressWaitStepMs = 4.096;
constexpr unsigned int mostSteps = 0xFF;
// How OBD requests begin on CAN 29 bit; adapters hold these five bits apart from the header.
constexpr std::string_view usualPriority = "18";

bool isAllDigits(std::string const& text)
{
    return std::all_of(text.begin(), text.end(), [](char each) { return hexDigitValue(each) >= 0; });
}

// An X takes any digit.
bool isPattern(std::string const& text)
{
    return std::all_of(text.begin(), text.end(), [](char each) { return each == 'X' || hexDigitValue(each) >= 0; });
}

bool fitsBus(RequestAddress const& address, BusKind bus)
{
    std::size_t const digits = address.header.size();
    bool const only = address.reply.empty() && address.extended.empty() && address.flowHeader.empty();
    bool const hex = isAllDigits(address.header) && isPattern(address.reply) && isAllDigits(address.extended) &&
                     isAllDigits(address.tester) && isAllDigits(address.flowHeader) && isAllDigits(address.flowData);
    switch (bus) {
    case BusKind::Unknown:
        return false;
    case BusKind::Can11:
        return hex && digits == 3;
    case BusKind::Can29:
        return hex && (digits == 6 || digits == 8);
    default:
        return hex && digits == 6 && only;
    }
}

// What the library has set, or what adapters begin with: the header of requests to all modules.
std::string usualHeader(AdapterState const& state)
{
    std::string const own = state.setting("ATSH");
    if (!own.empty()) {
        return own;
    }
    switch (state.shownBus()) {
    case BusKind::Can11:
        return "ATSH7DF";
    case BusKind::Can29:
        return "ATSHDB33F1";
    case BusKind::Kwp:
        return "ATSHC033F1";
    default:
        return state.protocol() == pwmProtocol ? "ATSH616AF1" : "ATSH686AF1";
    }
}

std::string settingOr(AdapterState const& state, std::string const& word, std::string const& usual)
{
    std::string const own = state.setting(word);
    return own.empty() ? usual : own;
}

std::string ownWaitCommand(unsigned int waitMs)
{
    constexpr char digits[] = "0123456789ABCDEF";
    auto const whole = static_cast<unsigned int>(static_cast<double>(waitMs) / addressWaitStepMs) + 1;
    unsigned int const steps = std::min(whole, mostSteps);
    return std::string("ATST") + digits[steps >> 4U] + digits[steps & 0x0FU];
}

// A header of 8 digits goes in two parts, which every version takes.
void addHeaderChanges(std::vector<AddressChange>& changes, std::string const& header, AdapterState const& state)
{
    std::size_t const longHeader = 8;
    bool const hasPriority = header.size() == longHeader;
    std::string const priority = hasPriority ? header.substr(0, 2) : std::string();
    std::string const usual = settingOr(state, "ATCP", "ATCP" + std::string(usualPriority));
    if (hasPriority && usual != "ATCP" + priority) {
        changes.push_back({"ATCP" + priority, {usual, {}}});
    }
    changes.push_back({"ATSH" + (hasPriority ? header.substr(2) : header), {usualHeader(state), {}}});
}

// Filter and mask, since ATCRA takes an X from level 2.0 on only.
void addPattern(std::vector<AddressChange>& changes, std::string const& reply)
{
    std::string filter = reply;
    std::string mask = reply;
    for (std::size_t i = 0; i < reply.size(); ++i) {
        bool const any = reply[i] == 'X';
        char const whole = i > 0 ? 'F' : reply.size() == 3 ? '7' : '1'; // 11 and 29 bits
        filter[i] = any ? '0' : reply[i];
        mask[i] = any ? '0' : whole;
    }
    changes.push_back({"ATCF" + filter, {"ATCRA", "ATAR"}});
    changes.push_back({"ATCM" + mask, {}});
}

} // namespace

std::vector<AddressChange> addressChanges(RequestAddress const& address, AdapterState const& state,
                                          std::string const& wait)
{
    std::vector<AddressChange> changes;
    if (!fitsBus(address, state.shownBus())) {
        return changes;
    }
    addHeaderChanges(changes, address.header, state);
    if (!address.extended.empty()) {
        changes.push_back({"ATCEA" + address.extended, {"ATCEA", {}}});
    }
    if (!address.tester.empty()) {
        changes.push_back({"ATTA" + address.tester, {}});
    }
    bool const isAny = address.reply.find('X') != std::string::npos;
    if (isAny) {
        addPattern(changes, address.reply);
    } else if (!address.reply.empty()) {
        // Without an argument it came with v1.4b; ATAR has the same effect.
        changes.push_back({"ATCRA" + address.reply, {settingOr(state, "ATCRA", "ATCRA"), "ATAR"}});
    }
    if (!address.flowHeader.empty()) {
        // The mode last: adapters refuse it before they have header and data.
        changes.push_back({"ATFCSH" + address.flowHeader, {}});
        changes.push_back({"ATFCSD" + address.flowData, {}});
        changes.push_back({"ATFCSM1", {"ATFCSM0", {}}});
    }
    std::string const full = address.stays ? state.setting("ATST") : std::string();
    std::string const wanted = address.waitMs != 0 ? ownWaitCommand(address.waitMs) : full;
    if (!wanted.empty() && !wait.empty() && wanted != wait) {
        changes.push_back({wanted, {wait, {}}});
    }
    if (!address.adaptive) {
        changes.push_back({"ATAT0", {settingOr(state, "ATAT", "ATAT1"), {}}});
    }
    return changes;
}

int restoreOrder(std::string const& command)
{
    constexpr std::string_view order[] = {"ATFCSM", "ATCEA", "ATCRA", "ATAR", "ATCP", "ATSH", "ATAT", "ATST"};
    auto const* const found =
        std::ranges::find_if(order, [&command](std::string_view word) { return command.starts_with(word); });
    return static_cast<int>(found - std::begin(order));
}

std::string addressWord(std::string const& command)
{
    bool const filter = command.starts_with("ATCEA") || command.starts_with("ATCRA");
    std::size_t const length = command.starts_with("ATFC") ? 6 : filter ? 5 : 4;
    return command.substr(0, length);
}

std::optional<RequestAddress> physicalAddress(BusKind bus, unsigned int module)
{
    RequestAddress address;
    if (bus == BusKind::Can11 && module >= 0x7E8 && module <= 0x7EF) {
        address.header = "7E" + std::to_string(module - 0x7E8);
    } else if (bus == BusKind::Can29 && (module & 0xFFFFFF00U) == 0x18DAF100U) {
        address.header = "DA" + frameDigits({static_cast<std::uint8_t>(module & 0xFFU)}) + "F1";
    } else {
        return std::nullopt;
    }
    return address;
}

} // namespace velmora
