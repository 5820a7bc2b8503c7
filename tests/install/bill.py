# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What is wrong with the bill of materials of an installation."""

import datetime
import hashlib
import json
import re

FIELDS = {
    "document": {"spdxVersion", "dataLicense", "SPDXID", "name", "documentNamespace", "creationInfo", "packages",
                 "files", "relationships"},
    "package": {"SPDXID", "name", "downloadLocation", "filesAnalyzed", "licenseConcluded", "licenseDeclared",
                "copyrightText"},
    "analysed": {"versionInfo", "supplier", "packageVerificationCode", "licenseInfoFromFiles"},
    "file": {"SPDXID", "fileName", "fileTypes", "checksums", "licenseConcluded", "licenseInfoInFiles", "copyrightText"},
}
BILL = "share/pmx/pmx.spdx.json"
KNOWN_LICENCES = {"MIT", "GPL-2.0-only", "BSD-3-Clause", "libpng-2.0", "NOASSERTION"}


def read(prefix):
    return json.loads((prefix / BILL).read_text(encoding="utf-8"))


def _fields(what, entry, *kinds):
    required = set().union(*(FIELDS[kind] for kind in kinds))
    if not required <= entry.keys():
        yield f"{what}: no {', '.join(sorted(required - entry.keys()))}"


def _licences(what, entry):
    words = set(re.findall(r"[\w.-]+", entry.get("licenseConcluded", ""))) - {"AND", "OR"}
    if not words or not words <= KNOWN_LICENCES:
        yield f"{what}: licence {entry.get('licenseConcluded')}"


def _head(bill):
    yield from _fields("document", bill, "document")
    if (bill.get("spdxVersion"), bill.get("dataLicense"), bill.get("SPDXID")) != ("SPDX-2.3", "CC0-1.0",
                                                                                "SPDXRef-DOCUMENT"):
        yield "document: version, licence of the data or identifier"
    if not re.fullmatch(r"urn:uuid:[0-9a-f-]{36}", bill.get("documentNamespace", "")):
        yield "document: namespace"
    try:
        datetime.datetime.strptime(bill["creationInfo"]["created"], "%Y-%m-%dT%H:%M:%SZ")
    except (KeyError, ValueError):
        yield "document: no moment of creation"


def _packages(bill, version):
    analysed = [package for package in bill["packages"] if package.get("filesAnalyzed")]
    if [package["name"] for package in analysed] != ["pmx"]:
        yield f"packages: analysed are {[package['name'] for package in analysed]}"
    for package in bill["packages"]:
        kinds = ("package", "analysed") if package.get("filesAnalyzed") else ("package",)
        yield from _fields(f"package {package.get('name')}", package, *kinds)
        yield from _licences(f"package {package.get('name')}", package)
    for package in analysed:
        if package.get("versionInfo") != version:
            yield f"package pmx: version {package.get('versionInfo')}"
        sums = sorted(entry["checksums"][0]["checksumValue"] for entry in bill["files"])
        code = hashlib.sha1("".join(sums).encode()).hexdigest()
        if package.get("packageVerificationCode") != {"packageVerificationCodeValue": code}:
            yield "package pmx: verification code"


def _files(bill, prefix):
    lying = {f"./{path.relative_to(prefix).as_posix()}" for path in prefix.rglob("*") if path.is_file()} - {f"./{BILL}"}
    named = {entry["fileName"] for entry in bill["files"]}
    yield from (f"{name}: installed, and not in the bill" for name in sorted(lying - named))
    yield from (f"{name}: in the bill, and not installed" for name in sorted(named - lying))
    for entry in bill["files"]:
        yield from _fields(entry["fileName"], entry, "file")
        yield from _licences(entry["fileName"], entry)
        if entry["fileName"] not in lying:
            continue
        content = (prefix / entry["fileName"]).read_bytes()
        for checksum in entry["checksums"]:
            if hashlib.new(checksum["algorithm"].lower(), content).hexdigest() != checksum["checksumValue"]:
                yield f"{entry['fileName']}: {checksum['algorithm']}"
        if {checksum["algorithm"] for checksum in entry["checksums"]} != {"SHA1", "SHA256"}:
            yield f"{entry['fileName']}: checksums"


def _relationships(bill):
    identifiers = [bill["SPDXID"], *(entry["SPDXID"] for entry in [*bill["packages"], *bill["files"]])]
    yield from (f"{name}: twice" for name in sorted({name for name in identifiers if identifiers.count(name) > 1}))
    yield from (f"{name}: no identifier" for name in identifiers if not re.fullmatch(r"SPDXRef-[A-Za-z0-9.-]+", name))
    for relationship in bill["relationships"]:
        for end in ("spdxElementId", "relatedSpdxElement"):
            if relationship[end] not in identifiers:
                yield f"relationship with {relationship[end]}, which is not there"
    contained = {entry["relatedSpdxElement"] for entry in bill["relationships"]
                 if entry["relationshipType"] == "CONTAINS"}
    if contained != {entry["SPDXID"] for entry in bill["files"]}:
        yield "relationships: the package does not contain exactly the files"
    if not any(entry["relationshipType"] == "DESCRIBES" for entry in bill["relationships"]):
        yield "relationships: nothing is described"


def complaints(prefix, version):
    bill = read(prefix)
    found = list(_head(bill))
    return found or [*_packages(bill, version), *_files(bill, prefix), *_relationships(bill)]
