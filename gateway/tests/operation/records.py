"""records.py SCHEMA FILE EXPRESSION...: every line of FILE is a record as SCHEMA has it, and each expression holds of them,
`r` being the list."""
import json
import sys

import jsonschema

schema = json.load(open(sys.argv[1]))
jsonschema.Draft202012Validator.check_schema(schema)
validator = jsonschema.Draft202012Validator(schema)
r = [json.loads(line) for line in open(sys.argv[2])]
for record in r:
    validator.validate(record)
for expression in sys.argv[3:]:
    if not eval(expression):
        sys.exit(f"not so: {expression}\n" + json.dumps(r, indent=1))
