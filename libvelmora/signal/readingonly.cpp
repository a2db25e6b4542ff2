#include "libvelmora/signal/readingonly.h"

#include "libvelmora/signal/signalhex.h"

#include <algorithm>
#include <iterator>
#include <string_view>

namespace velmora {

namespace {

using RequestBytes = std::vector<unsigned char>;

struct SignalService
{
    unsigned char service;
    std::size_t length; // of the request
};

// SAE J1979, ISO 14229-1 and ISO 14230-3: services that only read, with the bytes of one identifier.
constexpr SignalService signalServices[] = {
    {0x01, 2}, {0x02, 3}, {0x05, 3}, {0x06, 2}, {0x09, 2}, {0x1A, 2}, {0x21, 2}, {0x22, 3},
};

constexpr unsigned char codeServices[] = {0x03, 0x07, 0x0A, 0x12, 0x13, 0x17, 0x18, 0x19};
// Of service 19; 05 and 0F to 13 are of older editions and not needed.
constexpr unsigned char codeReports[] = {0x01, 0x02, 0x03, 0x04, 0x06, 0x07, 0x08, 0x09, 0x0A, 0x0B, 0x0C,
                                         0x0D, 0x0E, 0x14, 0x15, 0x17, 0x18, 0x19, 0x42, 0x55, 0x56};
constexpr unsigned char presenceKinds[] = {0x00, 0x80, 0x01, 0x02};

constexpr std::size_t mostBytes = 7; // that an adapter sends in one frame

struct ServiceDanger
{
    unsigned char service;
    std::string_view why;
};

// Services that people put into such files anyhow, and what they do.
constexpr ServiceDanger dangers[] = {
    {0x04, "clears trouble codes, which `velmora clear` does after asking"},
    {0x08, "runs tests, which `velmora routines` does after asking"},
    {0x10, "changes the session: a module may stop its normal work"},
    {0x11, "resets a module"},
    {0x14, "clears trouble codes"},
    {0x20, "ends a session"},
    {0x23, "reads memory by address, which can hang a module"},
    {0x26, "stops messages of a module"},
    {0x27, "unlocks a module"},
    {0x28, "stops a module's talk on the bus"},
    {0x29, "unlocks a module"},
    {0x2A, "makes a module send on by itself"},
    {0x2C, "changes definitions in a module"},
    {0x2E, "writes into a module"},
    {0x2F, "moves what a module controls"},
    {0x30, "moves what a module controls"},
    {0x31, "starts a routine of a module"},
    {0x32, "stops a routine of a module"},
    {0x34, "loads data into a module"},
    {0x35, "loads memory out of a module"},
    {0x36, "transfers data of a programming"},
    {0x37, "ends a transfer of a programming"},
    {0x38, "transfers files of a module"},
    {0x3B, "writes into a module"},
    {0x3D, "writes memory by address"},
    {0x83, "changes the timing of the link"},
    {0x84, "wraps other services"},
    {0x85, "stops a module from storing trouble codes"},
    {0x86, "makes a module send on by itself"},
    {0x87, "changes the rate of the link"},
    {0xAA, "makes a module send on by itself"},
};

template <typename Range>
bool contains(Range const& range, unsigned char value)
{
    return std::find(std::begin(range), std::end(range), value) != std::end(range);
}

std::string named(unsigned char service)
{
    return "service " + hexText({service});
}

std::string whyNot(unsigned char service)
{
    if (contains(codeServices, service)) {
        return named(service) + " reads trouble codes, which `velmora codes` does";
    }
    if (service == 0x3E) {
        return named(service) + " keeps a session open, which only the program itself does";
    }
    auto const* const danger = std::ranges::find(dangers, service, &ServiceDanger::service);
    return named(service) + " " +
           (danger != std::end(dangers) ? std::string(danger->why)
                                        : "is none of those that only read (01, 02, 05, 06, 09, 1A, 21, 22)");
}

std::optional<std::string> refusalForSignal(RequestBytes const& request)
{
    auto const* const row = std::ranges::find(signalServices, request.front(), &SignalService::service);
    if (row == std::end(signalServices)) {
        return whyNot(request.front());
    }
    // Service 22 takes several identifiers of two bytes at once.
    bool const fits = request.front() == 0x22 ? request.size() >= row->length && request.size() % 2 == 1
                                              : request.size() == row->length;
    if (!fits) {
        return named(request.front()) + " wants " + std::to_string(row->length) + " bytes, here are " +
               std::to_string(request.size());
    }
    return std::nullopt;
}

std::optional<std::string> refusalForCodes(RequestBytes const& request)
{
    if (!contains(codeServices, request.front())) {
        return whyNot(request.front());
    }
    if (request.front() == 0x19 && (request.size() < 2 || !contains(codeReports, request[1]))) {
        return named(request.front()) + " has no such report of trouble codes";
    }
    return std::nullopt;
}

} // namespace

std::optional<std::string> refusalFor(RequestBytes const& request, RequestPurpose purpose)
{
    if (request.empty()) {
        return "the request is empty";
    }
    if (request.size() > mostBytes) {
        return "a request has 7 bytes at most, here are " + std::to_string(request.size());
    }
    switch (purpose) {
    case RequestPurpose::Signal:
        return refusalForSignal(request);
    case RequestPurpose::Codes:
        return refusalForCodes(request);
    case RequestPurpose::Presence:
        if (request.size() == 2 && request.front() == 0x3E && contains(presenceKinds, request[1])) {
            return std::nullopt;
        }
        return whyNot(request.front());
    }
    return "nobody may send it";
}

} // namespace velmora
