#!/usr/bin/env python3
"""Generate the coding-layer table headers in src/tables/ from data/3gpp/.

src/tables/base_sequence_tables.h: TS 38.211 5.2.2.2-1..-4 (type 1, current edition), 5.2.2.2-2..-4 as in V15.1.0 (first
edition), 5.2.3.1-1..-4 (type 2), TS 36.211 5.5.1.2-2 (length-24 table of the Zadoff-Chu form)
and the ascending primes 31..1249 that bound the Zadoff-Chu lengths.
src/tables/small_block_tables.h: TS 38.212 Table 5.3.3.3-1 (basis sequences of the (32, K) code).

Usage: tools/gen_coding_tables.py [--check]   (--check: fail when a committed header differs)
"""

import json
import pathlib
import sys

ROOT = pathlib.Path(__file__).resolve().parent.parent
DATA = ROOT / "data" / "3gpp"
TABLES = ROOT / "src" / "tables"


def load(name):
    return json.loads((DATA / name).read_text())


def rows_of(doc, key, length, allowed):
    """Rows [u, v0, .., v(length-1)] for u = 0..29, values checked against `allowed`."""
    rows = doc[key]
    if [r[0] for r in rows] != list(range(30)):
        raise SystemExit(f"{key}: expected u = 0..29 in order")
    out = []
    for r in rows:
        values = r[1:]
        if len(values) != length or any(v not in allowed for v in values):
            raise SystemExit(f"{key}: malformed row {r}")
        out.append(values)
    return out


def primes(lo, hi):
    sieve = [True] * (hi + 1)
    sieve[0:2] = [False, False]
    for i in range(2, int(hi ** 0.5) + 1):
        if sieve[i]:
            sieve[i * i::i] = [False] * len(sieve[i * i::i])
    return [p for p in range(lo, hi + 1) if sieve[p]]


def table_text(name, ctype, rows, comment):
    width = len(rows[0])
    body = "\n".join("    {{" + ", ".join(str(v) for v in r) + "}}," for r in rows)
    return (f"/// {comment}\n"
            f"inline constexpr std::array<std::array<{ctype}, {width}>, 30> {name} = {{{{\n"
            f"{body}\n}}}};\n")


def render_base_sequences():
    type1 = load("ts38211_tables_5_2_2_2_low_papr_type1.json")
    first = load("ts38211_tables_5_2_2_2_low_papr_type1_first_edition.json")
    type2 = load("ts38211_tables_5_2_3_2_low_papr_type2.json")
    lte = load("ts36211_tables_5_5_1_2_lte_low_papr.json")
    qpsk = {-3, -1, 1, 3}
    odd8 = {-7, -5, -3, -1, 1, 3, 5, 7}
    bits = {0, 1}

    # The first edition is a renumbering of the current sequences; keep the file honest.
    current = {m: rows_of(type1, f"M{m}", m, qpsk) for m in (6, 12, 18, 24)}
    older = {m: rows_of(first, f"M{m}", m, qpsk) for m in (12, 18, 24)}
    for m in (12, 18, 24):
        mapping = first["current_row_of_first_edition_row"][f"M{m}"]
        for u, row in enumerate(older[m]):
            if current[m][mapping[u]] != row:
                raise SystemExit(f"first edition M{m} row {u} is not current row {mapping[u]}")

    prime_list = primes(31, 1249)
    if len(prime_list) != 194:
        raise SystemExit("expected 194 primes from 31 to 1249")

    parts = [
        table_text("kLowPaprType1Len6", "std::int8_t", current[6],
                   "TS 38.211 Table 5.2.2.2-1: phi(n) for M_ZC = 6, row u."),
        table_text("kLowPaprType1Len12", "std::int8_t", current[12],
                   "TS 38.211 Table 5.2.2.2-2 (current edition): phi(n) for M_ZC = 12."),
        table_text("kLowPaprType1Len18", "std::int8_t", current[18],
                   "TS 38.211 Table 5.2.2.2-3 (current edition): phi(n) for M_ZC = 18."),
        table_text("kLowPaprType1Len24", "std::int8_t", current[24],
                   "TS 38.211 Table 5.2.2.2-4 (current edition): phi(n) for M_ZC = 24."),
        table_text("kLowPaprType1Len12FirstEdition", "std::int8_t", older[12],
                   "TS 38.211 V15.1.0 Table 5.2.2.2-2: phi(n) for M_ZC = 12, first edition."),
        table_text("kLowPaprType1Len18FirstEdition", "std::int8_t", older[18],
                   "TS 38.211 V15.1.0 Table 5.2.2.2-3: phi(n) for M_ZC = 18, first edition."),
        table_text("kLowPaprType1Len24FirstEdition", "std::int8_t", older[24],
                   "TS 38.211 V15.1.0 Table 5.2.2.2-4: phi(n) for M_ZC = 24, first edition."),
        table_text("kLowPaprType2Len6", "std::int8_t", rows_of(type2, "M6_phi", 6, odd8),
                   "TS 38.211 Table 5.2.3.1-1: phi(n) for M = 6, x(n) = exp(j pi phi(n) / 8)."),
        table_text("kLowPaprType2Len12", "std::int8_t", rows_of(type2, "M12_b", 12, bits),
                   "TS 38.211 Table 5.2.3.1-2: bits b(n) for M = 12, through pi/2-BPSK."),
        table_text("kLowPaprType2Len18", "std::int8_t", rows_of(type2, "M18_b", 18, bits),
                   "TS 38.211 Table 5.2.3.1-3: bits b(n) for M = 18, through pi/2-BPSK."),
        table_text("kLowPaprType2Len24", "std::int8_t", rows_of(type2, "M24_b", 24, bits),
                   "TS 38.211 Table 5.2.3.1-4: bits b(n) for M = 24, through pi/2-BPSK."),
        table_text("kZadoffChuLen24", "double", rows_of(lte, "N24", 24, qpsk),
                   "TS 36.211 Table 5.5.1.2-2: phi(n) of the length-24 Zadoff-Chu form."),
    ]
    prime_lines = "\n".join("    " + ", ".join(str(p) for p in prime_list[i:i + 16]) + ","
                            for i in range(0, len(prime_list), 16))
    return f"""#pragma once
// Generated by tools/gen_coding_tables.py from data/3gpp/ts38211_tables_5_2_*.json and
// data/3gpp/ts36211_tables_5_5_1_2_lte_low_papr.json. Do not edit.
//
// Base sequence tables, 30 rows each, row u = sequence group 0..29:
//   TS 38.211 Tables 5.2.2.2-1..-4: low-PAPR type 1, current edition (lengths 6, 12, 18, 24)
//   TS 38.211 V15.1.0 Tables 5.2.2.2-2..-4: low-PAPR type 1, first edition (lengths 12, 18, 24)
//   TS 38.211 Tables 5.2.3.1-1..-4: low-PAPR type 2 (length 6 phases, lengths 12, 18, 24 bits)
//   TS 36.211 Table 5.5.1.2-2: length-24 table of the PUCCH format 0 Zadoff-Chu form
//   Ascending primes 31..1249 (194 entries)

#include <array>
#include <cstdint>

namespace Orvalis_NR::tables {{

{chr(10).join(parts)}
/// Ascending primes from 31 to 1249.
inline constexpr std::array<int, {len(prime_list)}> kZadoffChuPrimes = {{
{prime_lines}
}};

}}  // namespace Orvalis_NR::tables
"""


def render_small_block():
    doc = json.loads((DATA / "ts38212_table_5_3_3_3_1_small_block_basis_sequences.json").read_text())
    rows = doc["rows"]
    if [r[0] for r in rows] != list(range(32)):
        raise SystemExit("expected rows i = 0..31 in order")
    for r in rows:
        if len(r) != 12 or any(v not in (0, 1) for v in r[1:]):
            raise SystemExit(f"malformed row {r}")
    body = "\n".join("    {{" + ", ".join(str(v) for v in r[1:]) + "}}," for r in rows)
    return f"""#pragma once
// Generated by tools/gen_coding_tables.py from
// data/3gpp/ts38212_table_5_3_3_3_1_small_block_basis_sequences.json. Do not edit.
//
// {doc["table"]}: basis sequences M(i, n) of the (32, K) code, i = 0..31, n = 0..10.

#include <array>
#include <cstdint>

namespace Orvalis_NR::tables {{

/// {doc["table"]}: row i holds M(i, 0) .. M(i, 10).
inline constexpr std::array<std::array<std::int8_t, 11>, 32> kSmallBlockBasis = {{{{
{body}
}}}};

}}  // namespace Orvalis_NR::tables
"""



def main():
    outputs = {
        TABLES / "base_sequence_tables.h": render_base_sequences(),
        TABLES / "small_block_tables.h": render_small_block(),
    }
    check = "--check" in sys.argv[1:]
    for path, text in outputs.items():
        if not check:
            path.write_text(text)
        elif path.read_text() != text:
            raise SystemExit(f"{path} is out of date; run {sys.argv[0]}")


if __name__ == "__main__":
    main()
