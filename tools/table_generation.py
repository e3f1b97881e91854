"""What every table generator of tools/ shares: reading data/3gpp and writing (or, with
--check, comparing) its committed header under src/tables."""

import json
import pathlib
import sys

ROOT = pathlib.Path(__file__).resolve().parent.parent
DATA = ROOT / "data" / "3gpp"
TABLES = ROOT / "src" / "tables"


def load(name):
    return json.loads((DATA / name).read_text())


def emit(output, text):
    """Write `text` to `output`, or with --check fail when the committed file differs."""
    if "--check" in sys.argv:
        if output.read_text() != text:
            raise SystemExit(f"{output} differs from the generator's output")
        return
    output.write_text(text)
