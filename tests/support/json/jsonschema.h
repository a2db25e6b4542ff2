#pragma once

#include <string>

namespace support {

// Fails the test, with place and reason, unless the text is a JSON document as docs/json.schema.json defines it under
// that name.
void expectValid(std::string const& document, std::string const& definition);

// The places and reasons, a line each; empty for a valid document.
std::string schemaErrors(std::string const& document, std::string const& definition);

} // namespace support
