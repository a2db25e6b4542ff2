#include "libvelmora/uds/identification.h"

#include "libvelmora/signal/signalhex.h"

#include <fmt/format.h>

#include <algorithm>
#include <optional>

namespace velmora {

namespace {

bool isText(unsigned char byte)
{
    return byte >= ' ' && byte < 0x7F;
}

// Filling at the ends belongs to no text.
std::vector<unsigned char> withoutFilling(std::vector<unsigned char> data)
{
    auto const isFilling = [](unsigned char byte) { return byte == 0x00 || byte == 0xFF || byte == ' '; };
    while (!data.empty() && isFilling(data.back())) {
        data.pop_back();
    }
    data.erase(data.begin(), std::find_if_not(data.begin(), data.end(), isFilling));
    return data;
}

std::optional<std::string> plainText(std::vector<unsigned char> const& data)
{
    std::vector<unsigned char> const text = withoutFilling(data);
    return std::all_of(text.begin(), text.end(), isText) ? std::optional(std::string(text.begin(), text.end()))
                                                         : std::nullopt;
}

// Some makers write a date as digits in pairs, with two or four of the year.
std::optional<std::string> dateText(std::vector<unsigned char> const& data)
{
    std::string const digits = hexText(data);
    bool const decimal =
        std::all_of(digits.begin(), digits.end(), [](char each) { return each >= '0' && each <= '9'; });
    if (!decimal || (data.size() != 3 && data.size() != 4)) {
        return std::nullopt;
    }
    std::string const whole = data.size() == 3 ? "20" + digits : digits;
    int const month = std::stoi(whole.substr(4, 2));
    int const day = std::stoi(whole.substr(6));
    if (month < 1 || month > 12 || day < 1 || day > 31) {
        return std::nullopt;
    }
    return whole.substr(0, 4) + "-" + whole.substr(4, 2) + "-" + whole.substr(6);
}

std::optional<std::string> sessionText(std::vector<unsigned char> const& data)
{
    constexpr char const* sessions[] = {"default session", "programming session", "extended session",
                                        "safety system session"};
    bool const known = data.size() == 1 && data[0] >= 1 && data[0] <= 4;
    return known ? std::optional<std::string>(sessions[data[0] - 1]) : std::nullopt;
}

} // namespace

std::vector<IdentifierRow> const& standardIdentifiers()
{
    static std::vector<IdentifierRow> const rows = {
        {0xF180, "Boot Software Identification", IdentifierKind::CountedText},
        {0xF181, "Application Software Identification", IdentifierKind::CountedText},
        {0xF182, "Application Data Identification", IdentifierKind::CountedText},
        {0xF183, "Boot Software Fingerprint", IdentifierKind::Bytes},
        {0xF184, "Application Software Fingerprint", IdentifierKind::Bytes},
        {0xF185, "Application Data Fingerprint", IdentifierKind::Bytes},
        {0xF186, "Active Diagnostic Session", IdentifierKind::Session},
        {0xF187, "Vehicle Maker's Spare Part Number", IdentifierKind::Text},
        {0xF188, "Vehicle Maker's ECU Software Number", IdentifierKind::Text},
        {0xF189, "Vehicle Maker's ECU Software Version Number", IdentifierKind::Text},
        {0xF18A, "System Supplier Identifier", IdentifierKind::Text},
        {0xF18B, "ECU Manufacturing Date", IdentifierKind::Date},
        {0xF18C, "ECU Serial Number", IdentifierKind::Text},
        {0xF18D, "Supported Functional Units", IdentifierKind::Bytes},
        {0xF18E, "Vehicle Maker's Kit Assembly Part Number", IdentifierKind::Text},
        {0xF18F, "Regulation Software Identification Numbers (RxSWIN)", IdentifierKind::Text},
        {0xF190, "Vehicle Identification Number", IdentifierKind::Vin},
        {0xF191, "Vehicle Maker's ECU Hardware Number", IdentifierKind::Text},
        {0xF192, "System Supplier's ECU Hardware Number", IdentifierKind::Text},
        {0xF193, "System Supplier's ECU Hardware Version Number", IdentifierKind::Text},
        {0xF194, "System Supplier's ECU Software Number", IdentifierKind::Text},
        {0xF195, "System Supplier's ECU Software Version Number", IdentifierKind::Text},
        {0xF196, "Exhaust Regulation or Type Approval Number", IdentifierKind::Text},
        {0xF197, "System Name or Engine Type", IdentifierKind::Text},
        {0xF198, "Repair Shop Code or Tester Serial Number", IdentifierKind::Text},
        {0xF199, "Programming Date", IdentifierKind::Date},
        {0xF19A, "Calibration Repair Shop Code or Calibration Equipment Serial Number", IdentifierKind::Text},
        {0xF19B, "Calibration Date", IdentifierKind::Date},
        {0xF19C, "Calibration Equipment Software Number", IdentifierKind::Text},
        {0xF19D, "ECU Installation Date", IdentifierKind::Date},
        {0xF19E, "ODX File", IdentifierKind::Text},
        {0xF19F, "Entity", IdentifierKind::Bytes},
    };
    return rows;
}

namespace {

// Some modules put the count of texts in front. Where it is 0 it is filling.
std::optional<std::string> countedText(std::vector<unsigned char> const& data)
{
    bool const counted = data.size() > 1 && data.front() < ' ';
    return plainText(counted ? std::vector<unsigned char>(data.begin() + 1, data.end()) : data);
}

// Nothing for data that is not what it should be, and for bytes.
std::optional<std::string> wordsOf(IdentifierKind kind, std::vector<unsigned char> const& data)
{
    switch (kind) {
    case IdentifierKind::CountedText:
        return countedText(data);
    case IdentifierKind::Text:
    case IdentifierKind::Vin:
        return plainText(data);
    case IdentifierKind::Session:
        return sessionText(data);
    case IdentifierKind::Date: {
        std::optional<std::string> const date = dateText(data);
        return date ? date : plainText(data);
    }
    case IdentifierKind::Bytes:
        return std::nullopt;
    }
    return std::nullopt;
}

// Null for any other identifier.
IdentifierRow const* rowOfIdentifier(unsigned int did)
{
    auto const found = std::ranges::find(standardIdentifiers(), did, &IdentifierRow::did);
    return found != standardIdentifiers().end() ? &*found : nullptr;
}

} // namespace

std::string identifierText(unsigned int did, std::vector<unsigned char> const& data)
{
    IdentifierRow const* const row = rowOfIdentifier(did);
    return wordsOf(row != nullptr ? row->kind : IdentifierKind::Bytes, data).value_or(hexText(data));
}

std::string localIdentifierText(std::vector<unsigned char> const& data)
{
    return plainText(data).value_or(hexText(data));
}

std::string identifierName(unsigned int did)
{
    IdentifierRow const* const row = rowOfIdentifier(did);
    return row != nullptr ? row->name : fmt::format("Identification {:02X} by service {:02X}", did & 0xFFU, did >> 8U);
}

} // namespace velmora
