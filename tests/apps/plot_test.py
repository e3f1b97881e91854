#!/usr/bin/env python3
"""`nrsynth plot` driven as a user does; its numbers are checked against the waveform and 3GPP.

Usage: plot_test.py NRSYNTH EXAMPLES_DIR DATA_3GPP_DIR [BUILD_DIR]
The PAPR it prints is checked against the samples, the carrier edges against where the energy
is, the marker runs against the frame length, and the channel of every resource element of the
grid against positions computed here from the document: the SS/PBCH block of TS 38.211 clause
7.4.3.1, the REGs of the PDCCH with their DM-RS (clause 7.4.1.3.2), the PDSCH DM-RS symbols of
Tables 7.4.1.1.2-3/4 and the PT-RS symbols of clause 7.4.1.2.2.
"""

import json
import math
import os
import re
import shutil
import struct
import subprocess
import sys
import tempfile
import unittest

import numpy as np

CLI, EXAMPLES, TABLES = (os.path.abspath(p) for p in sys.argv[1:4])
BUILD = os.path.abspath(sys.argv[4]) if len(sys.argv) > 4 else None
PROBABILITY = 1e-4


def png_size(path):
    with open(path, "rb") as handle:
        head = handle.read(24)
    assert head[:8] == b"\x89PNG\r\n\x1a\n", "%s is not a PNG" % path
    return struct.unpack(">II", head[16:24])


def plot(*args, cli=CLI, env=None):
    environment = dict(os.environ, NRSYNTH_PYTHON=sys.executable)
    environment.update(env or {})
    return subprocess.run([cli, "plot"] + list(args), capture_output=True, text=True, env=environment)


def example(name):
    return os.path.join(EXAMPLES, name + ".json")


def document(name):
    """The document with the host values filled in, as generation uses it."""
    result = subprocess.run([CLI, "show", "--derived", example(name)], capture_output=True, text=True, check=True)
    return json.loads(result.stdout)


def generate(name, folder):
    out = os.path.join(folder, name, "wave.bin")
    subprocess.run([CLI, "generate", example(name), "-o", out], capture_output=True, check=True)
    return out


def slots_of(item, slots_per_frame):
    """Slots of frame 0 of a channel item, from its comma list of absolute slots."""
    return sorted({int(s) for s in item["SlotIndexArrayStr"].split(",") if int(s) < slots_per_frame})


class Grid:
    """Labels of one `--kind grid` run, addressed by slot, symbol and subcarrier from point A."""

    def __init__(self, npz, carrier):
        data = np.load(npz)
        self.labels = data["labels"]
        self.grid = data["grid"]
        self.names = [str(n) for n in data["names"]]
        self.mu = int(carrier["Mu"])
        scs = 15000 * 2 ** self.mu
        self.point_a = int(carrier["FrequencyOffsetOfPointA"] / scs)
        self.centre = self.labels.shape[1] // 2
        self.width = 12 * int(carrier["NumberOfRB"])

    def code(self, name):
        return self.names.index(name) + 1

    def where(self, name):
        """Set of (symbol in frame, subcarrier from point A) labelled `name`."""
        symbols, columns = np.nonzero(self.labels == self.code(name))
        return set(zip(symbols.tolist(), (columns - self.centre - self.point_a).tolist()))


def dmrs_symbols(pdsch):
    """First symbol of each DM-RS symbol (both for double symbols), TS 38.211 clause 7.4.1.1.2."""
    double = pdsch.get("DMRSDuration") == "DoubleSymbol"
    name = "ts38211_table_7_4_1_1_2_4_pdsch_dmrs_positions_double.json" if double else \
        "ts38211_table_7_4_1_1_2_3_pdsch_dmrs_positions_single.json"
    with open(os.path.join(TABLES, name)) as handle:
        table = json.load(handle)
    first, count = int(pdsch["FirstSymbol"]), int(pdsch["SymbolNumber"])
    type_a = pdsch.get("PDSCHMappingType", "A") == "A"
    duration = first + count if type_a else count
    column = table["columns"].index("type%s_pos%d" % ("A" if type_a else "B", int(pdsch.get("DMRSaddpos", 0))))
    row = next(r for r in table["rows"] if r[0] == str(duration))
    l0 = int(pdsch.get("DMRStypeApos", 2)) if type_a else 0
    base = 0 if type_a else first
    symbols = set()
    for value in row[column]:
        start = base + (l0 if value == "l0" else int(value))
        symbols.update({start, start + 1} if double else {start})
    return symbols


def ptrs_symbols(pdsch, dmrs):
    """PT-RS symbols of a slot, TS 38.211 clause 7.4.1.2.2 (L_PT-RS walk from the PDSCH start)."""
    first, last = int(pdsch["FirstSymbol"]), int(pdsch["FirstSymbol"]) + int(pdsch["SymbolNumber"]) - 1
    spacing = int(pdsch.get("L_PTRS", 1))
    i, reference, found = 0, first, set()
    while reference + i * spacing <= last:
        window = range(max(reference + (i - 1) * spacing + 1, reference), reference + i * spacing + 1)
        hit = [l for l in window if l in dmrs]
        if hit:
            i, reference = 1, max(hit)
            continue
        found.add(reference + i * spacing)
        i += 1
    return found


class PlotKindsOnSamples(unittest.TestCase):
    """spectrum, ccdf and power on generated files; each picture 1200 x 800 pixels."""

    @classmethod
    def setUpClass(cls):
        cls.work = tempfile.mkdtemp(prefix="nrsynth_plot_test_")
        # 51 RB of PDSCH over the whole carrier; an SS burst over two frames.
        cls.full = generate("csirs_trs_prs_30khz", cls.work).replace("wave.bin", "wave0.bin")
        cls.burst = generate("pdcch_coresets_30khz", cls.work)

    @classmethod
    def tearDownClass(cls):
        shutil.rmtree(cls.work)

    def picture(self, name):
        return os.path.join(self.work, name + ".png")

    def test_ccdf_papr_is_the_level_exceeded_by_one_sample_in_ten_thousand(self):
        for wave in (self.full, self.burst):
            result = plot(wave, "--kind", "ccdf", "-o", self.picture("ccdf"))
            self.assertEqual(result.returncode, 0, result.stderr)
            self.assertEqual(png_size(self.picture("ccdf")), (1200, 800))
            papr = float(re.search(r"PAPR at 0.0001: (-?[\d.]+) dB", result.stdout).group(1))
            x = np.fromfile(wave, dtype="<c16")
            relative = np.abs(x) ** 2 / np.mean(np.abs(x) ** 2)
            # Printed to 0.01 dB: at most 1e-4 of the samples lie above the level, more reach it.
            self.assertLessEqual(np.count_nonzero(relative > 10 ** ((papr + 0.005) / 10)), PROBABILITY * len(x))
            self.assertGreater(np.count_nonzero(relative >= 10 ** ((papr - 0.005) / 10)), PROBABILITY * len(x))

    def test_spectrum_edges_enclose_the_carrier_energy_tightly(self):
        result = plot(self.full, "--doc", example("csirs_trs_prs_30khz"), "--kind", "spectrum",
                      "-o", self.picture("spectrum"))
        self.assertEqual(result.returncode, 0, result.stderr)
        self.assertEqual(png_size(self.picture("spectrum")), (1200, 800))
        lower, upper = (1e6 * float(v) for v in
                        re.search(r"carrier 0 edges: (-?[\d.]+) MHz to (-?[\d.]+) MHz", result.stdout).groups())
        x = np.fromfile(self.full, dtype="<c16")
        energy = np.abs(np.fft.fft(x)) ** 2
        frequencies = np.fft.fftfreq(len(x), 1 / float(document("csirs_trs_prs_30khz")["SampleRateAuto"]))
        inside = lambda a, b: energy[(frequencies >= a) & (frequencies <= b)].sum() / energy.sum()
        self.assertGreater(inside(lower, upper), 0.995)
        margin = 0.02 * (upper - lower)  # the PDSCH fills every RB: edges drawn inside it lose energy
        self.assertLess(inside(lower + margin, upper - margin), 0.98)
        self.assertAlmostEqual(upper - lower, 51 * 12 * 30000, delta=1)

    def test_power_marker_runs_start_at_each_frame(self):
        result = plot(self.burst, "--doc", example("pdcch_coresets_30khz"), "--kind", "power",
                      "-o", self.picture("power"))
        self.assertEqual(result.returncode, 0, result.stderr)
        self.assertEqual(png_size(self.picture("power")), (1200, 800))
        frame = int(document("pdcch_coresets_30khz")["SampleRateAuto"]) // 100
        starts = re.search(r"Marker2 FrameStart: runs from samples ([\d ,]+)", result.stdout).group(1)
        self.assertEqual([int(s) for s in starts.split(",")], [0, frame])

    def test_problems_are_named(self):
        cases = [
            (["nowhere.bin", "--kind", "ccdf", "-o", "x.png"], {}, "sample file not found: nowhere.bin"),
            ([self.burst, "--kind", "grid", "-o", "x.png"], {}, "--kind grid needs --doc"),
            ([self.burst, "--kind", "ccdf", "-o", "x.png"], {"NRSYNTH_PYTHON": "/bin/false"},
             "numpy and matplotlib are not both importable by /bin/false"),
            ([self.burst, "--kind", "ccdf", "-o", "x.png"], {"NRSYNTH_PYTHON": "/no/python3"},
             "NRSYNTH_PYTHON=/no/python3 is not an executable"),
            ([self.burst, "--doc", example("default"), "--kind", "grid", "-o", "x.png"], {},
             "carrier type CW has no resource grid"),
        ]
        for args, env, message in cases:
            with self.subTest(message=message):
                result = plot(*args, env=env)
                self.assertEqual(result.returncode, 1)
                self.assertIn(message, result.stderr)

    def test_script_is_found_beside_the_executable_only(self):
        lonely = os.path.join(self.work, "lonely")
        os.makedirs(lonely, exist_ok=True)
        shutil.copy(CLI, lonely)
        result = plot(self.burst, "--kind", "ccdf", "-o", "x.png", cli=os.path.join(lonely, "nrsynth"))
        self.assertEqual(result.returncode, 1)
        self.assertIn("nrsynth_plot.py is missing", result.stderr)

    @unittest.skipUnless(BUILD, "no build folder given")
    def test_installed_tool_plots(self):
        prefix = os.path.join(self.work, "prefix")
        subprocess.run(["cmake", "--install", BUILD, "--component", "cli", "--prefix", prefix], capture_output=True, check=True)
        result = plot(self.burst, "--kind", "ccdf", "-o", self.picture("installed"),
                      cli=os.path.join(prefix, "bin", "nrsynth"))
        self.assertEqual(result.returncode, 0, result.stderr)
        self.assertEqual(png_size(self.picture("installed")), (1200, 800))


class GridLabels(unittest.TestCase):
    """The channel given to each resource element against positions worked out from the document."""

    @classmethod
    def setUpClass(cls):
        cls.work = tempfile.mkdtemp(prefix="nrsynth_grid_test_")
        cls.grids = {}

    @classmethod
    def tearDownClass(cls):
        shutil.rmtree(cls.work)

    def grid(self, name):
        if name not in self.grids:
            labels = os.path.join(self.work, name + ".npz")
            picture = os.path.join(self.work, name + ".png")
            result = plot("unused.bin", "--doc", example(name), "--kind", "grid", "-o", picture, "--labels", labels)
            self.assertEqual(result.returncode, 0, result.stderr)
            self.assertEqual(png_size(picture), (1200, 800))
            self.grids[name] = Grid(labels, document(name)["NRCarriers"][0])
        return self.grids[name]

    def test_every_nonzero_element_has_one_channel(self):
        for name in ("pdcch_coresets_30khz", "csirs_trs_prs_30khz", "pdsch_type_b_ptrs_20mhz"):
            with self.subTest(example=name):
                grid = self.grid(name)
                nonzero = grid.grid != 0
                self.assertTrue(nonzero.any())
                np.testing.assert_array_equal(grid.labels != 0, nonzero)
                self.assertFalse((grid.labels == grid.code("unresolved")).any())

    def test_ss_pbch_block_elements(self):
        grid = self.grid("pdcch_coresets_30khz")
        ssb = document("pdcch_coresets_30khz")["NRCarriers"][0]["Downlink"]["SSPBCH"]
        self.assertEqual((ssb["SSBlockPattern"], ssb["Lmax"], ssb["SSBActiveIndex"]), ("CaseB", 4, "0:3"))
        first_symbols = [4, 8, 16, 20]  # Case B, TS 38.213 clause 4.1, half frame 0
        # Subcarrier 0 of the block, from the carrier centre: the block is centred on FrequencyOffset.
        k0 = int(ssb["FrequencyOffset"]) - 120 - grid.point_a
        expected = set()
        for start in first_symbols:
            for k in range(56, 183):  # PSS and SSS, TS 38.211 Table 7.4.3.1-1
                expected.update({(start, k0 + k), (start + 2, k0 + k)})
            for k in range(240):  # PBCH and its DM-RS
                expected.update({(start + 1, k0 + k), (start + 3, k0 + k)})
            for k in list(range(48)) + list(range(192, 240)):
                expected.add((start + 2, k0 + k))
        self.assertEqual(grid.where("SS/PBCH"), expected)

    def test_pdcch_fills_whole_regs_with_dmrs_on_every_fourth_subcarrier(self):
        grid = self.grid("pdcch_coresets_30khz")
        carrier = document("pdcch_coresets_30khz")["NRCarriers"][0]
        bwp = carrier["Downlink"]["BWP"][0]
        allowed, regs_per_slot = set(), {}
        for dci in carrier["Downlink"]["DCI"]:
            coreset = bwp["Coreset%d" % dci.get("CoresetIndex", 0)]
            for slot in slots_of(dci, 10 * 2 ** grid.mu):
                first = 14 * slot + int(dci.get("FirstSymbol", 0))
                allowed.update(range(first, first + int(coreset["SymbolNumber"])))
                regs_per_slot[slot] = regs_per_slot.get(slot, 0) + 6 * int(dci["AggregationLevel"])
        data, dmrs = grid.where("PDCCH"), grid.where("PDCCH DM-RS")
        self.assertTrue(data and dmrs)
        regs = {}
        for symbol, k in data | dmrs:
            self.assertIn(symbol, allowed)
            regs.setdefault((symbol, k // 12), []).append(k % 12)
        for (symbol, rb), positions in regs.items():
            # TS 38.211 clause 7.4.1.3.2: DM-RS at k = 12n + 4k' + 1 of common RB n, data on the rest.
            self.assertEqual(sorted(positions), list(range(12)), (symbol, rb))
            self.assertEqual({k for k in range(12) if (symbol, 12 * rb + k) in dmrs}, {1, 5, 9}, (symbol, rb))
        counted = {}
        for symbol, _ in regs:
            counted[symbol // 14] = counted.get(symbol // 14, 0) + 1
        self.assertEqual(counted, regs_per_slot)
        # The SIB1 DCI sits in CORESET 0: common RBs from the BWP start plus the CORESET offset.
        coreset0 = bwp["Coreset0"]
        start = int(bwp["RBOffset"]) + int(coreset0["RBOffset"])
        sib1 = {rb for symbol, rb in regs if symbol // 14 in slots_of(carrier["Downlink"]["DCI"][0], 20)}
        self.assertTrue(sib1 <= set(range(start, start + int(coreset0["RBNumber"]))), sib1)

    def test_pdsch_dmrs_and_ptrs_symbols(self):
        for name in ("csirs_trs_prs_30khz", "pdsch_type_b_ptrs_20mhz"):
            with self.subTest(example=name):
                grid = self.grid(name)
                pdsch = document(name)["NRCarriers"][0]["Downlink"]["DLSCH"][0]
                slots = slots_of(pdsch, 10 * 2 ** grid.mu)
                dmrs = dmrs_symbols(pdsch)
                seen = {symbol for symbol, _ in grid.where("PDSCH DM-RS")}
                self.assertEqual(seen, {14 * s + l for s in slots for l in dmrs})
                # Two CDM groups without data: no data in a DM-RS symbol.
                self.assertFalse({symbol for symbol, _ in grid.where("PDSCH")} & seen)
                ptrs = grid.where("PDSCH PT-RS")
                if not pdsch.get("PTRSEnabled"):
                    self.assertFalse(ptrs)
                    continue
                expected = {14 * s + l for s in slots for l in ptrs_symbols(pdsch, dmrs)}
                self.assertEqual({symbol for symbol, _ in ptrs}, expected)
                # One PT-RS subcarrier every K_PT-RS RBs of the allocation (TS 38.211 clause 7.4.1.2.2).
                spacing, rbs = int(pdsch["K_PTRS"]), int(pdsch["RBNumber"])
                for symbol in expected:
                    columns = sorted(k for l, k in ptrs if l == symbol)
                    self.assertEqual(len(columns), math.ceil(rbs / spacing))
                    self.assertEqual(set(np.diff(columns)), {12 * spacing})


class Constellations(unittest.TestCase):
    def test_pbch_symbols_and_dmrs_per_block(self):
        with tempfile.TemporaryDirectory() as work:
            picture = os.path.join(work, "iq.png")
            result = plot("unused.bin", "--doc", example("pdcch_coresets_30khz"), "--kind", "constellation",
                          "-o", picture)
            self.assertEqual(result.returncode, 0, result.stderr)
            self.assertEqual(png_size(picture), (1200, 800))
        # 864 PBCH bits in QPSK and 144 DM-RS values per block (TS 38.211 clause 7.3.3, 7.4.1.4).
        self.assertIn("PBCH 0: 432 symbols, 144 DM-RS", result.stdout)
        self.assertRegex(result.stdout, r"PDCCH 0: \d+ symbols, \d+ DM-RS")


if __name__ == "__main__":
    unittest.main(argv=sys.argv[:1], verbosity=2)
