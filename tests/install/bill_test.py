#!/usr/bin/env python3
# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""Has a bill of materials written for a small installation, changes either, and looks for the complaint."""

import json
import os
import pathlib
import subprocess
import sys
import tempfile
import unittest

sys.dont_write_bytecode = True

import bill as bills  # noqa: E402

WRITER = pathlib.Path(__file__).resolve().parents[2] / "cmake/bill_of_materials.py"
FILES = {"bin/pmxboard": "tool", "lib/pmx/pmx_if.o": "object", "share/doc/pmx/LICENSES/MIT.txt": "May be used.",
         "include/pmx/a_b.h": "a", "include/pmx/a-b.h": "b"}


def install(prefix, epoch=None, names=tuple(FILES)):
    for name in FILES:
        (prefix / name).parent.mkdir(parents=True, exist_ok=True)
        (prefix / name).write_text(FILES[name])
    environment = {key: value for key, value in os.environ.items() if key != "SOURCE_DATE_EPOCH"}
    subprocess.run([sys.executable, WRITER, prefix, "1.2.3", "2026-11-02", prefix / bills.BILL, "CLI11=2.1",
                    "libedit="], input="".join(f"{prefix / name}\n" for name in names), text=True, check=True,
                   env={**environment, **({"SOURCE_DATE_EPOCH": epoch} if epoch else {})})


class BillOfMaterials(unittest.TestCase):
    def found(self, change=lambda bill: None, files=lambda prefix: None, **options):
        with tempfile.TemporaryDirectory() as directory:
            prefix = pathlib.Path(directory)
            install(prefix, **options)
            bill = bills.read(prefix)
            change(bill)
            (prefix / bills.BILL).write_text(json.dumps(bill))
            files(prefix)
            return bills.complaints(prefix, "1.2.3")

    def test_good(self):
        self.assertEqual([], self.found())

    def test_the_same_files_give_the_same_bill_at_the_date_of_the_version(self):
        written = []
        for epoch in (None, None, "86400"):
            with tempfile.TemporaryDirectory() as directory:
                install(pathlib.Path(directory), epoch)
                written.append((pathlib.Path(directory) / bills.BILL).read_bytes())
        self.assertEqual(written[0], written[1])
        self.assertIn(b'"created": "2026-11-02T00:00:00Z"', written[0])
        self.assertIn(b'"created": "1970-01-02T00:00:00Z"', written[2])

    def test_libraries_are_in_the_tool(self):
        with tempfile.TemporaryDirectory() as directory:
            install(pathlib.Path(directory))
            bill = bills.read(pathlib.Path(directory))
        licences = {entry["fileName"]: entry["licenseConcluded"] for entry in bill["files"]}
        self.assertEqual("(MIT OR GPL-2.0-only) AND BSD-3-Clause", licences["./bin/pmxboard"])
        self.assertEqual("MIT OR GPL-2.0-only", licences["./lib/pmx/pmx_if.o"])
        self.assertEqual({"STATIC_LINK", "DYNAMIC_LINK", "CONTAINS", "DESCRIBES"},
                         {entry["relationshipType"] for entry in bill["relationships"]})

    def test_files_that_are_not_what_it_says(self):
        self.assertEqual(["./bin/pmxboard: SHA1", "./bin/pmxboard: SHA256"],
                         self.found(files=lambda prefix: (prefix / "bin/pmxboard").write_text("other")))
        self.assertEqual(["./bin/pmxboard: in the bill, and not installed"],
                         self.found(files=lambda prefix: (prefix / "bin/pmxboard").unlink()))
        self.assertEqual(["./bin/pmxboard: installed, and not in the bill"], self.found(names=list(FILES)[1:]))

    def test_fields_that_are_missing_or_wrong(self):
        for change, complaint in (
                (lambda bill: bill.pop("dataLicense"), "document: no dataLicense"),
                (lambda bill: bill.update(spdxVersion="SPDX-2.2"), "document: version"),
                (lambda bill: bill["creationInfo"].update(created="today"), "document: no moment of creation"),
                (lambda bill: bill["packages"][0].update(versionInfo="1.2.4"), "package pmx: version 1.2.4"),
                (lambda bill: bill["packages"][0].update(packageVerificationCode={}), "package pmx: verification code"),
                (lambda bill: bill["packages"][1].pop("licenseDeclared"), "package CLI11: no licenseDeclared"),
                (lambda bill: bill["files"][0].update(licenseConcluded="Free"), "./bin/pmxboard: licence Free"),
                (lambda bill: bill["files"][0]["checksums"].pop(), "./bin/pmxboard: checksums"),
                (lambda bill: bill["files"][0].update(SPDXID=bill["files"][1]["SPDXID"]), ": twice"),
                (lambda bill: bill["relationships"].pop(1), "does not contain exactly the files"),
                (lambda bill: bill["relationships"].pop(0), "nothing is described")):
            found = self.found(change)
            self.assertTrue(any(complaint in line for line in found), f"{complaint} is not in {found}")


if __name__ == "__main__":
    unittest.main()
