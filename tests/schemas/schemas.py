# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""The schemas of what the tool writes for programs, and what is wrong with a document by one of them."""

import json
import pathlib
import sys

try:
    import jsonschema
except ImportError:
    sys.exit(f"{sys.executable}: no module jsonschema: ./dev setup installs python3-jsonschema")

DIRECTORY = pathlib.Path(__file__).resolve().parents[2] / "docs/schemas"
Dialect = jsonschema.Draft202012Validator


def read():
    """Each schema by its name: {"trace": …}."""
    return {path.name.removesuffix(".schema.json"): json.loads(path.read_text(encoding="utf-8"))
            for path in sorted(DIRECTORY.glob("*.schema.json"))}


class Schemas:
    def __init__(self):
        self.by_name = read()
        store = {schema["$id"]: schema for schema in self.by_name.values()}
        self._validators = {
            name: Dialect(schema, resolver=jsonschema.RefResolver(schema["$id"], schema, store=store))
            for name, schema in self.by_name.items()}

    def complaint(self, name, document):
        """What is wrong with a document first, and where; empty when nothing is."""
        error = jsonschema.exceptions.best_match(self._validators[name].iter_errors(document))
        return f"{error.json_path}: {error.message[:300]}" if error else ""
