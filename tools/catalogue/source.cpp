#include "tools/catalogue/source.h"

#include "tools/catalogue/codepattern.h"
#include "tools/catalogue/makers.h"
#include "tools/catalogue/trim.h"

#include <algorithm>
#include <optional>

namespace catalogue {

namespace {

// Takes the first word off a line.
std::string_view takeWord(std::string_view& line)
{
    std::size_t const end = std::min(line.find(' '), line.size());
    std::string_view const word = line.substr(0, end);
    line = trim(line.substr(end));
    return word;
}

// Takes the codes off a line: words that end in a comma go on with the next one.
std::vector<std::string> takeCodes(std::string_view& line)
{
    std::vector<std::string> codes;
    for (bool more = true; more;) {
        std::string_view word = takeWord(line);
        more = word.ends_with(',');
        if (more) {
            word.remove_suffix(1);
        }
        for (std::string& code : expandCodes(word)) {
            codes.push_back(std::move(code));
        }
    }
    return codes;
}

// Texts are plain ASCII, so that they show the same in every terminal and need no encoding.
void requirePrintable(std::string_view line)
{
    auto const printable = [](char character) { return character >= ' ' && character <= '~'; };
    if (!std::all_of(line.begin(), line.end(), printable)) {
        throw SourceError("a control character, a tab or a character outside ASCII");
    }
}

void requireText(std::string_view text)
{
    if (text.empty()) {
        throw SourceError("the text is empty");
    }
    if (text.size() > maximumTextLength) {
        throw SourceError("the text has " + std::to_string(text.size()) + " characters, more than " +
                          std::to_string(maximumTextLength));
    }
    if (text.find("  ") != std::string_view::npos) {
        throw SourceError("two blanks in a row inside the text");
    }
}

std::size_t requireMaker(std::string_view name)
{
    auto const maker = findMaker(name);
    if (!maker) {
        throw SourceError("unknown maker '" + std::string(name) + "'");
    }
    return *maker;
}

// Reads the lines of one file.
class FileReader
{
public:
    FileReader(std::string const& file, Source& source)
        : m_source(source), m_lists(source.sharedLists), m_place{file, 0}
    {}

    void read(std::istream& input)
    {
        std::string line;
        while (std::getline(input, line)) {
            ++m_place.line;
            try {
                readLine(line);
            } catch (SourceError const& error) {
                m_source.problems.push_back(toString(m_place) + ": " + error.what());
            }
        }
        if (!m_maker) {
            m_source.sharedLists = std::move(m_lists);
        }
    }

private:
    void readLine(std::string_view line);
    void readMaker(std::string_view name);
    void readList(std::string_view definition);
    void readTwin(std::string_view line);
    void readMalformed(std::string_view line);
    void readRows(std::string_view line, bool repeat);
    void addRow(std::string code, std::string text, bool repeat);
    std::size_t currentMaker() const;

    Source& m_source;
    Lists m_lists;
    Place m_place;
    std::optional<std::size_t> m_maker;
};

void FileReader::readLine(std::string_view line)
{
    if (line.ends_with('\r')) {
        line.remove_suffix(1);
    }
    requirePrintable(line);
    line = trim(line);
    if (line.empty() || line.front() == '#') {
        return;
    }
    std::string_view rest = line;
    std::string_view const word = takeWord(rest);
    if (word == "maker") {
        readMaker(rest);
    } else if (word == "list") {
        readList(rest);
    } else if (line.starts_with("same as ")) {
        readTwin(trim(line.substr(std::string_view("same as ").size())));
    } else if (word == "malformed") {
        readMalformed(rest);
    } else if (word == "repeat") {
        readRows(rest, true);
    } else {
        readRows(line, false);
    }
}

void FileReader::readMaker(std::string_view name)
{
    if (m_maker) {
        throw SourceError("the file has named its maker already");
    }
    m_maker = requireMaker(name);
}

// list NAME = ENTRY | ENTRY | ...
void FileReader::readList(std::string_view definition)
{
    std::size_t const equals = std::min(definition.find('='), definition.size());
    std::string_view const name = trim(definition.substr(0, equals));
    if (name.empty() || equals == definition.size()) {
        throw SourceError("a list reads 'list NAME = ENTRY | ENTRY'");
    }
    std::vector<std::string> entries = splitAlternatives(definition.substr(equals + 1));
    if (!m_lists.emplace(name, std::move(entries)).second) {
        throw SourceError("there is a list '" + std::string(name) + "' already");
    }
}

// same as MAKER
// same as MAKER except CODES
void FileReader::readTwin(std::string_view line)
{
    constexpr std::string_view except = " except ";
    std::size_t const end = line.find(except);
    Twin twin{currentMaker(), requireMaker(line.substr(0, end)), {}, m_place};
    if (end != std::string_view::npos) {
        line = trim(line.substr(end + except.size()));
        twin.exceptions = takeCodes(line);
        if (!line.empty()) {
            throw SourceError("something stands behind the codes of 'except'");
        }
    }
    m_source.twins.push_back(std::move(twin));
}

// A code that no vehicle can send but that the lists hold; it is kept as it is.
void FileReader::readMalformed(std::string_view line)
{
    std::string code(takeWord(line));
    if (isTroubleCode(code)) {
        throw SourceError("'" + code + "' is a well-formed code: leave 'malformed' out");
    }
    if (code.size() > maximumCodeLength) {
        throw SourceError("a malformed code has at most " + std::to_string(maximumCodeLength) + " characters");
    }
    addRow(std::move(code), std::string(line), false);
}

void FileReader::readRows(std::string_view line, bool repeat)
{
    std::vector<std::string> codes = takeCodes(line);
    std::vector<std::string> texts = expandText(line, codes.size(), m_lists);
    for (std::size_t i = 0; i < codes.size(); ++i) {
        addRow(std::move(codes[i]), std::move(texts[i]), repeat);
    }
}

void FileReader::addRow(std::string code, std::string text, bool repeat)
{
    requireText(text);
    m_source.rows.push_back({currentMaker(), std::move(code), std::move(text), repeat, m_place});
}

std::size_t FileReader::currentMaker() const
{
    if (!m_maker) {
        throw SourceError("a 'maker' line must come before the first code");
    }
    return *m_maker;
}

} // namespace

void readSource(std::istream& input, std::string const& file, Source& source)
{
    FileReader(file, source).read(input);
}

} // namespace catalogue
