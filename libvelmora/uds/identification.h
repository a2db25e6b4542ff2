#pragma once

#include <velmora/modules.h>

#include <string>
#include <vector>

namespace velmora {

// What the data of an identifier F180 to F19F (ISO 14229-1) is.
enum class IdentifierKind
{
    Text,
    CountedText, // a count of items may stand before the text
    Bytes,
    Session,
    Date,
    Vin,
};

struct IdentifierRow
{
    unsigned int did;
    char const* name;
    IdentifierKind kind;
};

// F180 to F19F, in rising order.
std::vector<IdentifierRow> const& standardIdentifiers();

// The data of a local identifier of service 1A: text, or hexadecimal where it is none.
std::string localIdentifierText(std::vector<unsigned char> const& data);

} // namespace velmora
