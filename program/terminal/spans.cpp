#include "program/terminal/spans.h"

#include <algorithm>
#include <charconv>

namespace velmora::cli {

namespace {

void change(SpanLook& look, int code)
{
    if (code == 0) {
        look = {};
    } else if (code == 1) {
        look.bold = true;
    } else if (code == 2) {
        look.dim = true;
    } else if (code == 7) {
        look.reverse = true;
    } else if (code >= 30 && code <= 37) {
        look.color = code - 30;
    }
}

// The numbers between the semicolons; none is 0.
void changeAll(SpanLook& look, std::string_view codes)
{
    for (std::size_t begin = 0; begin <= codes.size();) {
        std::size_t const end = std::min(codes.find(';', begin), codes.size());
        int code = 0;
        std::from_chars(codes.data() + begin, codes.data() + end, code);
        change(look, code);
        begin = end + 1;
    }
}

} // namespace

std::vector<Span> spansOf(std::string_view line)
{
    std::vector<Span> spans;
    SpanLook look;
    while (!line.empty()) {
        if (line.starts_with("\033[")) {
            std::size_t const end = line.find_first_not_of("0123456789;", 2);
            if (end < line.size() && line[end] == 'm') {
                changeAll(look, line.substr(2, end - 2));
            }
            line.remove_prefix(std::min(end, line.size() - 1) + 1);
            continue;
        }
        std::string_view const plain = line.substr(0, line.find("\033[", 1));
        spans.push_back({std::string(plain), look});
        line.remove_prefix(plain.size());
    }
    return spans;
}

} // namespace velmora::cli
