#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Writes what an installation consists of as an SPDX 2.3 document: each file with its checksums and licence, and the
libraries that went into it. The same files give the same document: its date is the version's, or SOURCE_DATE_EPOCH.

usage: bill_of_materials.py PREFIX VERSION DATE DOCUMENT [LIBRARY=VERSION...] < installed files, a path a line
"""

import datetime
import hashlib
import json
import os
import pathlib
import re
import sys
import uuid

NAME = "pmx"
LICENCE = "MIT OR GPL-2.0-only"
AUTHORS = "The PMX authors"

TOOL, BOARD = "bin/pmxboard", "lib/pmx/libpmx_board.a"
# Of each library that may be found: its licence, how it is taken in, and by which files.
LIBRARIES = {
    "CLI11": ("BSD-3-Clause", "STATIC_LINK", (TOOL,)),
    "nlohmann_json": ("MIT", "STATIC_LINK", (TOOL, BOARD)),
    "tomlplusplus": ("MIT", "STATIC_LINK", (TOOL, BOARD)),
    "libedit": ("BSD-3-Clause", "DYNAMIC_LINK", (TOOL,)),
    "pixman": ("MIT", "DYNAMIC_LINK", (TOOL, BOARD)),
    "libpng": ("libpng-2.0", "DYNAMIC_LINK", (TOOL, BOARD)),
    "libsixel": ("MIT", "DYNAMIC_LINK", (TOOL,)),
}


def identifier(kind, name):
    return f"SPDXRef-{kind}-" + re.sub(r"[^A-Za-z0-9.]", "-", name) + "-" + hashlib.sha1(name.encode()).hexdigest()[:8]


def kind_of(name):
    if name.endswith((".o", ".a")) or name.startswith("bin/"):
        return "BINARY"
    if name.endswith((".h", ".c", ".cpp", ".py", ".cmake", "CMakeLists.txt")):
        return "SOURCE"
    return "TEXT" if name.endswith((".md", ".txt", ".pmx", ".toml", ".json", ".1")) else "OTHER"


def licence_of(name, libraries):
    """The licence that follows from a file's own and those of the libraries in it."""
    if "/LICENSES/" in name:
        return "NOASSERTION"   # a text that nobody may change
    taken = sorted({licence for library, (licence, how, users) in LIBRARIES.items()
                    if library in libraries and how == "STATIC_LINK" and name in users})
    return " AND ".join([f"({LICENCE})", *taken]) if taken else LICENCE


def file_entry(prefix, name, libraries):
    content = (prefix / name).read_bytes()
    return {
        "SPDXID": identifier("File", name),
        "fileName": f"./{name}",
        "fileTypes": [kind_of(name)],
        "checksums": [{"algorithm": "SHA1", "checksumValue": hashlib.sha1(content).hexdigest()},
                      {"algorithm": "SHA256", "checksumValue": hashlib.sha256(content).hexdigest()}],
        "licenseConcluded": licence_of(name, libraries),
        "licenseInfoInFiles": ["NOASSERTION"],
        "copyrightText": "NOASSERTION" if "/LICENSES/" in name else f"Copyright {AUTHORS}",
    }


def verification_code(files):
    """As SPDX computes it: of the sorted checksums of all files."""
    sums = sorted(entry["checksums"][0]["checksumValue"] for entry in files)
    return hashlib.sha1("".join(sums).encode()).hexdigest()


def package_entry(version, files):
    return {
        "SPDXID": identifier("Package", NAME),
        "name": NAME,
        "versionInfo": version,
        "supplier": f"Organization: {AUTHORS}",
        "downloadLocation": "NOASSERTION",
        "filesAnalyzed": True,
        "packageVerificationCode": {"packageVerificationCodeValue": verification_code(files)},
        "licenseConcluded": LICENCE,
        "licenseDeclared": LICENCE,
        "licenseInfoFromFiles": ["NOASSERTION"],
        "copyrightText": f"Copyright {AUTHORS}",
    }


def library_entry(name, version):
    entry = {
        "SPDXID": identifier("Package", name),
        "name": name,
        "downloadLocation": "NOASSERTION",
        "filesAnalyzed": False,
        "licenseConcluded": LIBRARIES[name][0],
        "licenseDeclared": LIBRARIES[name][0],
        "copyrightText": "NOASSERTION",
    }
    return {**entry, "versionInfo": version} if version else entry


def relationships(files, libraries):
    package = identifier("Package", NAME)
    yield "SPDXRef-DOCUMENT", "DESCRIBES", package
    for entry in files:
        yield package, "CONTAINS", entry["SPDXID"]
    names = {entry["fileName"].removeprefix("./") for entry in files}
    for library in libraries:
        _, how, users = LIBRARIES[library]
        for user in users:
            if user in names:
                yield identifier("File", user), how, identifier("Package", library)


def created(date):
    epoch = os.environ.get("SOURCE_DATE_EPOCH")
    moment = (datetime.datetime.fromtimestamp(int(epoch), datetime.timezone.utc) if epoch
              else datetime.datetime.fromisoformat(date))
    return moment.strftime("%Y-%m-%dT%H:%M:%SZ")


def document(prefix, names, version, date, libraries):
    files = [file_entry(prefix, name, libraries) for name in sorted(names)]
    package = package_entry(version, files)
    moment = created(date)
    contents = f"{NAME} {version} {moment} {package['packageVerificationCode']['packageVerificationCodeValue']}"
    return {
        "spdxVersion": "SPDX-2.3",
        "dataLicense": "CC0-1.0",
        "SPDXID": "SPDXRef-DOCUMENT",
        "name": f"{NAME}-{version}",
        "documentNamespace": f"urn:uuid:{uuid.uuid5(uuid.NAMESPACE_OID, contents)}",
        "creationInfo": {"created": moment, "creators": [f"Organization: {AUTHORS}", "Tool: bill_of_materials.py"]},
        "packages": [package, *(library_entry(name, of) for name, of in sorted(libraries.items()))],
        "files": files,
        "relationships": [{"spdxElementId": one, "relationshipType": how, "relatedSpdxElement": other}
                          for one, how, other in relationships(files, libraries)],
    }


def main():
    prefix, version, date, written, *found = sys.argv[1:]
    libraries = dict(word.split("=", 1) for word in found)
    prefix, written = pathlib.Path(prefix), pathlib.Path(written)
    installed = {os.path.relpath(line.strip(), prefix) for line in sys.stdin if line.strip()}
    bill = document(prefix, installed - {os.path.relpath(written, prefix)}, version, date, libraries)
    written.parent.mkdir(parents=True, exist_ok=True)
    written.write_text(json.dumps(bill, indent=1) + "\n", encoding="utf-8")
    return 0


if __name__ == "__main__":
    sys.exit(main())
