"""Prints what is wrong with a JSON document, a line each: validatejson.py SCHEMA DEFINITION DOCUMENT"""

import json
import sys

import jsonschema


def main(schema_file, definition, document_file):
    with open(schema_file, encoding="utf-8") as file:
        whole = json.load(file)
    root = dict(whole["definitions"][definition], definitions=whole["definitions"])
    jsonschema.Draft7Validator.check_schema(root)
    try:
        with open(document_file, encoding="utf-8") as file:
            document = json.load(file)
    except ValueError as error:
        print("this is no JSON document:", error)
        return
    for error in jsonschema.Draft7Validator(root).iter_errors(document):
        print("/".join(str(part) for part in error.path) + ":", error.message)


main(*sys.argv[1:])
