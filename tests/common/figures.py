# SPDX-License-Identifier: MIT OR GPL-2.0-only
"""What a run counted, for the page of claims: build/figures/NAME.json. tests/claims/claims.py holds it against that."""

import json
import pathlib

FOLDER = pathlib.Path(__file__).resolve().parents[2] / "build/figures"


def note(name, **figures):
    FOLDER.mkdir(parents=True, exist_ok=True)
    text = json.dumps(figures, indent=1, sort_keys=True) + "\n"
    (FOLDER / f"{name}.json").write_text(text, encoding="utf-8")
