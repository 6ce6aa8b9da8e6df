"""Validates the given documents against a schema, and checks that the schema rejects invalid ones.

    validate.py SCHEMA DOCUMENT ...
"""

import json
import sys

import jsonschema

WRONG = [
    '{}',
    '{"root": {}}',
    '{"root": {"id": -1}}',
    '{"root": {"id": "01"}}',
    '{"version": 2, "root": {"id": 1}}',
    '{"root": {"id": 1}, "other": 1}',
    '{"framesPerSecond": 0, "root": {"id": 1}}',
    '{"root": {"id": 1, "other": 1}}',
    '{"root": {"id": 1, "children": {}}}',
    '{"root": {"id": 1, "connections": [{"from": [1, 2]}]}}',
    '{"root": {"id": 1, "connections": [{"from": [1, 2, 3], "to": [1, 2]}]}}',
    '{"root": {"id": 1, "inputs": [{"id": 1}]}}',
    '{"root": {"id": 1, "inputs": [{"id": 1, "type": "Float"}]}}',
    '{"root": {"id": 1, "inputs": [{"id": 1, "type": "float", "default": "5"}]}}',
    '{"root": {"id": 1, "inputs": [{"id": 1, "type": "float", "default": true}]}}',
    '{"root": {"id": 1, "inputs": [{"id": 1, "type": "vec2", "default": [1]}]}}',
    '{"root": {"id": 1, "inputs": [{"id": 1, "type": "boolean", "default": 1}]}}',
    '{"root": {"id": 1, "inputs": [{"id": 1, "type": "path", "default": [["moveTo", 1]]}]}}',
    '{"root": {"id": 1, "inputs": [{"id": 1, "type": "float", "minType": "int"}]}}',
    '{"root": {"id": 1, "attributes": []}}',
    '{"root": {"id": 1, "attributes": {"$x": 1}}}',
    '{"root": {"id": 1, "attributes": {"a": {"$float": 1}}}}',
    '{"root": {"id": 1, "modelLayer": {"children": []}}}',
]


def main():
    with open(sys.argv[1], encoding="utf-8") as file:
        schema = json.load(file)
    jsonschema.Draft202012Validator.check_schema(schema)
    validator = jsonschema.Draft202012Validator(schema)
    for name in sys.argv[2:]:
        with open(name, encoding="utf-8") as file:
            error = jsonschema.exceptions.best_match(validator.iter_errors(json.load(file)))
        if error is not None:
            sys.exit(f"{name}: {error.json_path}: {error.message}")
    for text in WRONG:
        if validator.is_valid(json.loads(text)):
            sys.exit(f"the schema takes {text}")
    print(f"{len(sys.argv) - 2} documents are valid, {len(WRONG)} are rejected")


main()
