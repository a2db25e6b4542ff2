#include "program/view/csvfield.h"

namespace velmora::cli {

std::string csvField(std::string const& text)
{
    if (text.find_first_of(",\"\r\n") == std::string::npos) {
        return text;
    }
    std::string result = "\"";
    for (char const each : text) {
        result += each == '"' ? std::string("\"\"") : std::string(1, each);
    }
    return result + "\"";
}

} // namespace velmora::cli
