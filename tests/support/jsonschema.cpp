#include "tests/support/jsonschema.h"

#include <fstream>
#include <gtest/gtest.h>
#include <nlohmann/json.hpp>
#include <valijson/adapters/nlohmann_json_adapter.hpp>
#include <valijson/schema.hpp>
#include <valijson/schema_parser.hpp>
#include <valijson/validation_results.hpp>
#include <valijson/validator.hpp>

namespace support {

namespace {

using Adapter = valijson::adapters::NlohmannJsonAdapter;

// The schema of the whole file with one definition as its root, so that references find the others.
nlohmann::json schemaOf(std::string const& definition)
{
    std::ifstream file(std::string(VELMORA_SOURCE_DIR) + "/docs/json.schema.json");
    nlohmann::json whole = nlohmann::json::parse(file);
    nlohmann::json root = whole.at("definitions").at(definition);
    root["definitions"] = whole["definitions"];
    return root;
}

std::string toText(valijson::ValidationResults& results)
{
    std::string text;
    valijson::ValidationResults::Error error;
    while (results.popError(error)) {
        for (std::string const& part : error.context) {
            text += part;
        }
        text += ": " + error.description + "\n";
    }
    return text;
}

} // namespace

std::string schemaErrors(std::string const& document, std::string const& definition)
{
    nlohmann::json const parsed = nlohmann::json::parse(document, nullptr, false);
    if (parsed.is_discarded()) {
        return "this is no JSON document\n";
    }
    nlohmann::json const root = schemaOf(definition);
    valijson::Schema schema;
    valijson::SchemaParser(valijson::SchemaParser::kDraft7).populateSchema(Adapter(root), schema);
    valijson::Validator validator;
    valijson::ValidationResults results;
    bool const valid = validator.validate(schema, Adapter(parsed), &results);
    return valid ? std::string() : "the document does not match\n" + toText(results);
}

void expectValid(std::string const& document, std::string const& definition)
{
    std::string const errors = schemaErrors(document, definition);
    EXPECT_TRUE(errors.empty()) << definition << ": " << errors << document;
}

} // namespace support
