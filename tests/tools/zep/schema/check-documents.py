#!/usr/bin/env python3
# SPDX-License-Identifier: Apache-2.0
"""Validates the documents of zep against their schemas.

    check-documents.py SCHEMAS MEMBERS [DOCUMENTS]

SCHEMAS: the directory with *.schema.json. MEMBERS: the directory that lists the members of each version. DOCUMENTS: a directory
of documents, each in a file *.json, and of reports in lines, each in a file *.jsonl. Every schema must be valid, and no member of a version may change or go: members-VERSION.txt
has a line for each, with its type. A new member is added to the list with --record in place of DOCUMENTS. A directory without
documents proves nothing: the exit status is then 77, which ctest shows as skipped, or 1 with CI=true.
"""
import json
import multiprocessing
import os
import sys
from pathlib import Path

SKIPPED = 1 if os.environ.get("CI") == "true" else 77  # the exit status

try:
    from jsonschema import Draft202012Validator
except ImportError:
    print("the package python3-jsonschema is not installed")
    sys.exit(SKIPPED)

LINES = "zep report --format jsonl"  # the title of the schema for a line
KIND = ("type", "const", "enum", "$ref")


def read(path):
    return json.loads(path.read_text(encoding="utf-8"))


def load(directory):
    return {path.name: read(path) for path in sorted(directory.glob("*.schema.json"))}


def whole(schema, common):
    """The schema with the common parts in it, so that it refers to no other file."""
    text = json.dumps(schema).replace("common.schema.json#", "#")
    result = json.loads(text)
    result["$defs"] = {**common["$defs"], **result.get("$defs", {})}
    return result


def validators(schemas):
    """A validator for each document, by its name."""
    result = {}
    for schema in schemas.values():
        Draft202012Validator.check_schema(schema)
        if "title" in schema:
            result[schema["title"]] = Draft202012Validator(whole(schema, schemas["common.schema.json"]))
    return result


def members(schemas):
    """A line for each member that a schema names, with all that is said of it except the description."""
    lines = set()

    def visit(node, place):
        if isinstance(node, list):
            for at, item in enumerate(node):
                visit(item, f"{place}/{at}")
        elif isinstance(node, dict):
            for name, member in node.get("properties", {}).items():
                kind = member if isinstance(member, bool) else {key: member[key] for key in KIND if key in member}
                lines.add(f"{place}.{name} {json.dumps(kind, sort_keys=True)}")
                visit(member, f"{place}.{name}")
            for key, value in node.items():
                if key not in ("properties", "if", "then", "else"):
                    visit(value, place if key == "items" else f"{place}/{key}")

    for name, schema in schemas.items():
        visit(schema, name.removesuffix(".schema.json"))
    return lines


def check_members(schemas, directory, is_recording):
    version = schemas["common.schema.json"]["$defs"]["head"]["properties"]["version"]["const"]
    path = directory / f"members-{version}.txt"
    recorded = set(path.read_text(encoding="utf-8").splitlines()) if path.exists() else set()
    now = members(schemas)
    if is_recording:
        path.write_text("\n".join(sorted(recorded | now)) + "\n", encoding="utf-8")
        return []
    return ([f"{line}: changed or gone, but the version is still {version}" for line in sorted(recorded - now)] +
            [f"{line}: new, and not in {path.name} (--record)" for line in sorted(now - recorded)])


def problems_in(document, title, name):
    """The problems of one document or line: its file, the place, and what is wrong there."""
    validator = checkers.get(title)
    if validator is None:
        return [f"{name}: no schema for \"{title}\""]
    found = sorted(validator.iter_errors(document), key=lambda error: len(error.absolute_path), reverse=True)
    return [f"{name} ({title}): /{'/'.join(map(str, error.absolute_path))}: {error.message[:300]}" for error in found[:3]]


def problems_of(path):
    """The problems of one document, or of the lines of one report."""
    if path.suffix == ".json":
        document = read(path)
        return problems_in(document, document["document"], path.name)
    lines = [json.loads(line) for line in path.read_text(encoding="utf-8").splitlines()]
    problems = [f"{path.name}: the last line has not the number of instances"] if lines[-1].get("instances") != len(lines) - 2 else []
    for number, line in enumerate(lines, 1):
        problems += problems_in(line, LINES, f"{path.name}:{number}")
    return problems[:3]


def main():
    global checkers
    schemas, lists = load(Path(sys.argv[1])), Path(sys.argv[2])
    checkers = validators(schemas)
    documents = Path(sys.argv[3]) if len(sys.argv) > 3 and sys.argv[3] != "--record" else None
    problems = check_members(schemas, lists, sys.argv[3:] == ["--record"])
    paths = sorted([*documents.glob("*.json"), *documents.glob("*.jsonl")]) if documents else []
    with multiprocessing.Pool() as pool:
        for found in pool.imap_unordered(problems_of, paths, 4):
            problems += found
    if documents and not paths and not problems:
        print(f"no documents in {documents}: no test kept one")
        sys.exit(SKIPPED)
    print("\n".join(problems[:50]) or f"{len(paths)} documents and {len(checkers)} schemas are valid")
    sys.exit(1 if problems else 0)


main()
