#!/usr/bin/env python3
"""Pictures of an nrsynth waveform: spectrum, CCDF, power over time, resource grid, constellations.

Run by `nrsynth plot`; it can also be run by hand:
    nrsynth_plot.py WAVE.bin [--doc WAVE.json] --kind spectrum|ccdf|power|grid|constellation -o OUT.png

Sample files are raw little-endian complex doubles; the marker file is WAVE.bin + ".mkr", one byte
per sample, bit i being line Marker(i+1). The document is read through `nrsynth show` so that the
defaults and the host values that generation works out are the ones used here as well.
"""

import argparse
import json
import os
import subprocess
import sys
import tempfile

KINDS = ("spectrum", "ccdf", "power", "grid", "constellation")
WIDTH_PX, HEIGHT_PX, DPI = 1200, 800, 100
CCDF_PROBABILITY = 1e-4

try:
    import numpy as np
    import matplotlib

    matplotlib.use("Agg")
    import matplotlib.pyplot as plt
    from matplotlib.colors import ListedColormap
except ImportError as missing:  # pragma: no cover - depends on the machine
    np = None
    IMPORT_PROBLEM = str(missing)
else:
    IMPORT_PROBLEM = None


class PlotError(Exception):
    """A problem the user can correct; printed without a traceback."""


# ---------------------------------------------------------------- document and samples


def run_cli(cli, args):
    result = subprocess.run([cli] + args, capture_output=True, text=True)
    if result.returncode != 0:
        raise PlotError("nrsynth %s failed:\n%s" % (" ".join(args), (result.stderr or result.stdout).strip()))
    return result.stdout


def load_document(cli, path):
    """The effective settings tree of `path`: every default filled in, host values worked out."""
    if not os.path.isfile(path):
        raise PlotError("document not found: %s" % path)
    derived = run_cli(cli, ["show", "--derived", path])
    with tempfile.NamedTemporaryFile("w", suffix=".json", delete=False) as handle:
        handle.write(derived)
        derived_path = handle.name
    try:
        return json.loads(run_cli(cli, ["show", derived_path]))
    finally:
        os.unlink(derived_path)


def items(collection):
    """The list of a collection in either JSON form (array or {"$values": [...]})."""
    if isinstance(collection, dict):
        return collection.get("$values", [])
    return collection or []


def sample_rate(document):
    if document.get("UserDefinedSampleRateEnabled") and document.get("SampleRateUser", 0) > 0:
        return float(document["SampleRateUser"])
    return float(document.get("SampleRateAuto", 0.0))


def read_samples(path):
    if not os.path.isfile(path):
        raise PlotError("sample file not found: %s" % path)
    size = os.path.getsize(path)
    if size == 0 or size % 16:
        raise PlotError("%s: %d bytes is not a whole number of complex-double samples" % (path, size))
    return np.memmap(path, dtype="<c16", mode="r")


def carrier_numbers(carrier):
    """Subcarrier spacing in Hz, point A in subcarriers from the carrier centre, and its width."""
    scs = 15000.0 * 2 ** int(carrier.get("Mu", 0))
    # Generators place common RB 0 at trunc(FrequencyOffsetOfPointA / SCS) from the centre.
    point_a = int(carrier.get("FrequencyOffsetOfPointA", 0.0) / scs)
    return scs, point_a, 12 * int(carrier.get("NumberOfRB", 0))


def carrier_edges(carrier):
    """Lower and upper edge in Hz (baseband) of the occupied band of one NR carrier."""
    scs, point_a, width = carrier_numbers(carrier)
    lower = carrier.get("FrequencyOffset", 0.0) + (point_a - 0.5) * scs
    return lower, lower + width * scs


def new_figure():
    return plt.figure(figsize=(WIDTH_PX / DPI, HEIGHT_PX / DPI), dpi=DPI)


def save(figure, path):
    figure.savefig(path, dpi=DPI)
    plt.close(figure)
    print("picture: %s" % path)


# ---------------------------------------------------------------- spectrum


def welch_psd(x, fs, segment, max_segments=2000):
    """Welch estimate: Hann-windowed segments at 50 % overlap, periodograms averaged.

    Returns frequencies (Hz, ascending, DC in the middle) and the density in 1/Hz (power per Hz of
    the samples as they stand). Long files are sampled by evenly spread segments."""
    segment = min(segment, len(x))
    window = np.hanning(segment)
    starts = np.arange(0, len(x) - segment + 1, segment // 2)
    if len(starts) > max_segments:
        starts = starts[np.linspace(0, len(starts) - 1, max_segments).astype(int)]
    total = np.zeros(segment)
    for start in starts:
        spectrum = np.fft.fft(np.asarray(x[start:start + segment]) * window)
        total += spectrum.real ** 2 + spectrum.imag ** 2
    density = total / len(starts) / (fs * np.sum(window ** 2))
    frequencies = np.fft.fftfreq(segment, 1.0 / fs)
    return np.fft.fftshift(frequencies), np.fft.fftshift(density)


def plot_spectrum(x, document, out):
    fs = sample_rate(document) if document else 0.0
    scale = fs if fs > 0 else 1.0
    frequencies, density = welch_psd(x, scale, 4096)
    floor = density.max() * 1e-12 if density.max() > 0 else 1e-300
    figure = new_figure()
    axes = figure.add_subplot(1, 1, 1)
    axes.plot(frequencies / 1e6 if fs > 0 else frequencies, 10 * np.log10(np.maximum(density, floor)), lw=0.7)
    if fs > 0:
        axes.set_xlabel("frequency from the centre (MHz)")
        axes.set_ylabel("power spectral density (dB/Hz)")
        for index, carrier in enumerate(items(document.get("NRCarriers"))):
            if not carrier.get("Enabled", True):
                continue
            if carrier.get("CarrierType") in ("DL", "UL"):
                lower, upper = carrier_edges(carrier)
                for edge in (lower, upper):
                    axes.axvline(edge / 1e6, color="tab:red", ls="--", lw=0.9)
                axes.text((lower + upper) / 2e6, 0.98, "carrier %d" % index, color="tab:red",
                          ha="center", va="top", transform=axes.get_xaxis_transform())
                print("carrier %d edges: %.6f MHz to %.6f MHz" % (index, lower / 1e6, upper / 1e6))
            else:
                axes.axvline(carrier.get("FrequencyOffset", 0.0) / 1e6, color="tab:red", ls=":", lw=0.9)
    else:
        axes.set_xlabel("frequency (cycles per sample)")
        axes.set_ylabel("power spectral density (dB per unit)")
    axes.set_title("Spectrum (Welch, Hann window, %d-point segments)" % len(frequencies))
    axes.grid(True, alpha=0.3)
    save(figure, out)


# ---------------------------------------------------------------- CCDF


def power_ccdf(x, block=1 << 20):
    """Instantaneous power relative to the mean: levels (dB) and P(power/mean > level)."""
    powers = np.empty(len(x))
    for start in range(0, len(x), block):
        chunk = np.asarray(x[start:start + block])
        powers[start:start + len(chunk)] = chunk.real ** 2 + chunk.imag ** 2
    mean = powers.mean()
    if mean <= 0:
        raise PlotError("the waveform is all zeros: no CCDF")
    powers[::-1].sort()  # descending, in place
    probabilities = np.arange(1, len(powers) + 1) / len(powers)
    with np.errstate(divide="ignore"):
        levels = 10 * np.log10(powers / mean)
    return levels, probabilities


def level_at(levels, probability):
    """The level exceeded by at most `probability` of the samples: the sample of rank floor(p N)
    in descending order (samples strictly above it are at most p N)."""
    return float(levels[min(int(np.floor(probability * len(levels))), len(levels) - 1)])


def plot_ccdf(x, out):
    levels, probabilities = power_ccdf(x)
    papr = level_at(levels, CCDF_PROBABILITY)
    print("PAPR at %g: %.2f dB" % (CCDF_PROBABILITY, papr))
    print("peak to average: %.2f dB" % levels[0])
    keep = np.isfinite(levels) & (levels > -20)
    figure = new_figure()
    axes = figure.add_subplot(1, 1, 1)
    axes.semilogy(levels[keep], probabilities[keep], lw=1.2)
    axes.axhline(CCDF_PROBABILITY, color="gray", ls=":", lw=0.8)
    axes.axvline(papr, color="tab:red", ls="--", lw=0.9)
    axes.text(0.98, 0.95, "PAPR at %g: %.2f dB" % (CCDF_PROBABILITY, papr), transform=axes.transAxes,
              ha="right", va="top", fontsize=12, color="tab:red")
    axes.set_xlabel("instantaneous power above the mean (dB)")
    axes.set_ylabel("probability of exceeding")
    axes.set_ylim(max(0.5 / len(levels), 1e-7), 1.0)
    axes.set_xlim(left=max(-20.0, float(levels[keep].min()) if keep.any() else -20.0))
    axes.set_title("CCDF of instantaneous power (%d samples)" % len(levels))
    axes.grid(True, which="both", alpha=0.3)
    save(figure, out)


# ---------------------------------------------------------------- power over time


def block_power(x, block):
    """Mean power of consecutive blocks of `block` samples (the last one may be shorter)."""
    count = (len(x) + block - 1) // block
    result = np.empty(count)
    for index in range(count):
        chunk = np.asarray(x[index * block:(index + 1) * block])
        result[index] = np.mean(chunk.real ** 2 + chunk.imag ** 2)
    return result


def marker_runs(markers, bit):
    """Start and end (exclusive) sample of each run where marker line `bit` is high."""
    line = ((np.asarray(markers) >> bit) & 1).astype(np.int8)
    edges = np.flatnonzero(np.diff(np.concatenate(([0], line, [0]))))
    return edges[0::2], edges[1::2]


def plot_power(x, path, document, out):
    fs = sample_rate(document) if document else 0.0
    mu = max([int(c.get("Mu", 0)) for c in items((document or {}).get("NRCarriers"))] or [0])
    # About one OFDM symbol of the finest numerology per point.
    block = max(1, int(round(fs / (14000.0 * 2 ** mu)))) if fs > 0 else max(1, len(x) // 2000)
    powers = block_power(x, block)
    top = powers.max()
    if top <= 0:
        raise PlotError("the waveform is all zeros: no power profile")
    level = 10 * np.log10(np.maximum(powers, top * 1e-10))
    scale, unit = (1e3 / fs, "ms") if fs > 0 else (1.0, "samples")
    times = np.arange(len(powers)) * block * scale

    marker_path = path + ".mkr"
    markers = np.memmap(marker_path, dtype=np.uint8, mode="r") if os.path.isfile(marker_path) else None
    figure = new_figure()
    grid = figure.add_gridspec(2, 1, height_ratios=(3, 1), hspace=0.08)
    axes = figure.add_subplot(grid[0])
    axes.step(times, level, where="post", lw=0.8)
    axes.axhline(10 * np.log10(np.mean(powers)), color="gray", ls=":", lw=0.8)
    axes.set_ylabel("mean power per block (dB)")
    axes.set_title("Power over time, blocks of %d samples" % block)
    axes.grid(True, alpha=0.3)
    lines = figure.add_subplot(grid[1], sharex=axes)
    if markers is None:
        lines.text(0.5, 0.5, "no marker file %s" % os.path.basename(marker_path), ha="center",
                   transform=lines.transAxes)
    else:
        if len(markers) != len(x):
            raise PlotError("%s holds %d bytes for %d samples" % (marker_path, len(markers), len(x)))
        names = [str((document or {}).get("Marker%d" % (bit + 1), "")) for bit in range(4)]
        for bit in range(4):
            starts, ends = marker_runs(markers, bit)
            shown = ", ".join(str(start) for start in starts[:20]) + (", ..." if len(starts) > 20 else "")
            print("Marker%d %s: %s" % (bit + 1, names[bit], "runs from samples " + shown if len(starts) else "never high"))
            base = 3 - bit
            lines.hlines(base, 0, len(x) * scale, color="lightgray", lw=0.5)
            for start, end in zip(starts, ends):
                lines.fill_between([start * scale, max(end, start + 1) * scale], base, base + 0.7,
                                   color="C%d" % (bit + 1), lw=0.8)
        lines.set_yticks([3.35, 2.35, 1.35, 0.35])
        lines.set_yticklabels(["M%d %s" % (bit + 1, names[bit]) for bit in range(4)], fontsize=8)
        lines.set_ylim(-0.2, 4)
    lines.set_xlabel("time (%s)" % unit)
    plt.setp(axes.get_xticklabels(), visible=False)
    figure.subplots_adjust(left=0.14, right=0.98)
    save(figure, out)


# ---------------------------------------------------------------- exported stages


def read_complex(path):
    """One `re im` pair a line, as written by the intermediate data export."""
    values = np.fromfile(path, sep=" ")
    if len(values) % 2:
        raise PlotError("%s: odd number of numbers" % path)
    return values.view(complex) if len(values) else np.zeros(0, complex)


def export_frame(cli, tree, folder, carrier):
    """Generates `tree` with only carrier `carrier` enabled and the export on; returns the process."""
    document = json.loads(json.dumps(tree))
    for index, item in enumerate(items(document["NRCarriers"])):
        item["Enabled"] = index == carrier
        # The filter and the noise act on samples after the exported grid: off for speed.
        item["BasebandFilter"] = False
    document["AwgnEnabled"] = False
    os.makedirs(folder, exist_ok=True)
    path = os.path.join(folder, "wave.json")
    with open(path, "w") as handle:
        json.dump(document, handle)
    command = [cli, "generate", path, "-o", os.path.join(folder, "wave.bin"), "--as-is", "--force",
               "--export", folder]
    return subprocess.Popen(command, stdout=subprocess.PIPE, stderr=subprocess.STDOUT, text=True)


def finish(process, what):
    output, _ = process.communicate()
    if process.returncode != 0:
        raise PlotError("generating %s failed:\n%s" % (what, output.strip()))


def stage_folder(folder):
    return os.path.join(folder, "Intermediate Data")


def check_carrier(tree, carrier):
    carriers = items(tree.get("NRCarriers"))
    if not 0 <= carrier < len(carriers):
        raise PlotError("--carrier %d: the document has %d carrier(s)" % (carrier, len(carriers)))
    if carriers[carrier].get("CarrierType") not in ("DL", "UL"):
        raise PlotError("--carrier %d: carrier type %s has no resource grid"
                        % (carrier, carriers[carrier].get("CarrierType")))
    return carriers[carrier]


# ---------------------------------------------------------------- resource grid

# Display name of each channel class with its colour; the order is the legend's.
CHANNELS = [
    ("SS/PBCH", "#1f77b4"), ("PDCCH", "#ff7f0e"), ("PDCCH DM-RS", "#8c3b00"), ("PDSCH", "#2ca02c"),
    ("PDSCH DM-RS", "#d62728"), ("PDSCH PT-RS", "#e377c2"), ("CSI-RS", "#9467bd"), ("PRS", "#17becf"),
    ("PUSCH", "#2ca02c"), ("PUSCH DM-RS", "#d62728"), ("PUSCH PT-RS", "#e377c2"), ("PUCCH", "#ff7f0e"),
    ("PUCCH DM-RS", "#8c3b00"), ("SRS", "#9467bd"), ("unresolved", "#000000"),
]
CHANNEL_NAMES = [name for name, _ in CHANNELS]
UNRESOLVED = CHANNEL_NAMES.index("unresolved") + 1


def power_keys(carrier):
    """Every power setting that scales one channel class of the carrier's grid.

    Each entry: (settings object, data key, [(relative key, class name)...], class name). A data
    key scales the whole item (its DM-RS and PT-RS ride on it); a relative key scales its class on
    top of the data level (TS 38.214 power offsets of DM-RS and PT-RS to the data)."""
    downlink = carrier.get("Downlink") or {}
    uplink = carrier.get("Uplink") or {}
    found = []
    ssb = downlink.get("SSPBCH") or {}
    if ssb.get("Enabled"):
        found.append((ssb, "PowerBoosting", [], "SS/PBCH"))
    for dci in items(downlink.get("DCI")):
        if dci.get("Enabled", True):
            found.append((dci, "PowerBoosting", [("DMRSPowerBoosting", "PDCCH DM-RS")], "PDCCH"))
    for csirs in items(downlink.get("CSIRS")):
        if csirs.get("Enabled", True):
            found.append((csirs, "PowerBoosting", [], "CSI-RS"))
    for prs in items(downlink.get("PRS")):
        if prs.get("Enabled", False):
            found.append((prs, "PowerBoosting", [], "PRS"))
    for pdsch in items(downlink.get("DLSCH")):
        if pdsch.get("Enabled", True):
            found.append((pdsch, "PowerBoosting", [("DMRSPowerBoosting", "PDSCH DM-RS"),
                                                  ("PTRSPowerBoosting", "PDSCH PT-RS")], "PDSCH"))
    for srs in items(uplink.get("SRSs")):
        if srs.get("Enabled", True):
            found.append((srs, "PowerBoosting", [], "SRS"))
    for pusch in items(uplink.get("ULSCH")):
        if pusch.get("Enabled", True):
            found.append((pusch, "PowerBoosting", [("DMRSPowerBoosting", "PUSCH DM-RS"),
                                                  ("PTRSPowerBoosting", "PUSCH PT-RS")], "PUSCH"))
    for pucch in items(uplink.get("UCI")):
        if pucch.get("Enabled", True):
            found.append((pucch, "PowerBoosting", [("DMRSPowerBoosting", "PUCCH DM-RS")], "PUCCH"))
    return found


def tag_powers(tree, carrier_index, step_db=2.0):
    """A copy of `tree` in which every channel class of the carrier is raised by its own amount.

    Class n (counted from 1) is raised by n * step_db in total, so that a resource element's value
    in this copy divided by its value in the document tells the class that wrote it. Returns the
    copy and the list of (linear amplitude factor, class name)."""
    tagged = json.loads(json.dumps(tree))
    carrier = items(tagged["NRCarriers"])[carrier_index]
    factors = []
    serial = 0
    for settings, key, relatives, name in power_keys(carrier):
        serial += 1
        data_db = serial * step_db
        settings[key] = float(settings.get(key, 0.0)) + data_db
        factors.append((10 ** (data_db / 20), name))
        for relative_key, relative_name in relatives:
            serial += 1
            settings[relative_key] = float(settings.get(relative_key, 0.0)) + serial * step_db - data_db
            factors.append((10 ** (serial * step_db / 20), relative_name))
    return tagged, factors


def classify(base, tagged, factors, tolerance=2e-4):
    """Channel number (index in CHANNEL_NAMES plus one, 0 for an empty element) per element.

    An element's class is the one whose amplitude factor equals tagged/base; a non-zero element
    that matches no factor (two channels summed into it) is `unresolved`."""
    labels = np.zeros(base.shape, dtype=np.int16)
    occupied = base != 0
    ratio = np.zeros(base.shape, dtype=complex)
    ratio[occupied] = tagged[occupied] / base[occupied]
    labels[occupied] = UNRESOLVED
    for factor, name in factors:
        match = occupied & (np.abs(ratio - factor) <= tolerance * factor)
        labels[match] = CHANNEL_NAMES.index(name) + 1
    return labels


def frame_grid(path, carrier):
    """The frame store of antenna 0, one row per OFDM symbol, columns from the lowest subcarrier
    (index 0 is subcarrier -fftSize/2 from the centre)."""
    values = read_complex(path)
    symbols = (12 if carrier.get("CPType") == "Extended" else 14) * 10 * 2 ** int(carrier.get("Mu", 0))
    if len(values) == 0 or len(values) % symbols:
        raise PlotError("%s: %d values are not %d symbols of one transform length" % (path, len(values), symbols))
    return np.fft.fftshift(values.reshape(symbols, -1), axes=1)


def mux_file(folder):
    names = [n for n in os.listdir(stage_folder(folder)) if n.endswith("_Mux_Ant0_Mux_Out.txt")]
    if not names:
        raise PlotError("the export holds no frame store of antenna 0")
    return os.path.join(stage_folder(folder), names[0])


def grid_labels(cli, tree, carrier_index, work):
    """The document's frame store of antenna 0 and the channel of each of its elements."""
    carrier = check_carrier(tree, carrier_index)
    tagged, factors = tag_powers(tree, carrier_index)
    base_folder, tagged_folder = os.path.join(work, "document"), os.path.join(work, "tagged")
    runs = [export_frame(cli, tree, base_folder, carrier_index)]
    if factors:
        runs.append(export_frame(cli, tagged, tagged_folder, carrier_index))
    for run, what in zip(runs, ("the document", "the power-tagged document")):
        finish(run, what)
    base = frame_grid(mux_file(base_folder), carrier)
    if factors:
        labels = classify(base, frame_grid(mux_file(tagged_folder), carrier), factors)
    else:
        labels = np.where(base != 0, UNRESOLVED, 0).astype(np.int16)
    return base, labels


def plot_grid(cli, tree, carrier_index, out, labels_out):
    carrier = check_carrier(tree, carrier_index)
    with tempfile.TemporaryDirectory(prefix="nrsynth_grid_") as work:
        base, labels = grid_labels(cli, tree, carrier_index, work)
    half = base.shape[1] // 2
    _, point_a, width = carrier_numbers(carrier)
    if labels_out:
        np.savez_compressed(labels_out, labels=labels, grid=base, names=np.array(CHANNEL_NAMES),
                            centre_column=half, point_a=point_a)
    # Columns of the carrier's resource blocks, widened to any element written outside them.
    used = np.flatnonzero(labels.any(axis=0))
    first = min(half + point_a, used[0] if len(used) else half + point_a)
    last = max(half + point_a + width, used[-1] + 1 if len(used) else 0)
    view = labels[:, first:last]
    present = [code for code in range(1, len(CHANNELS) + 1) if (view == code).any()]
    for code in present:
        print("%s: %d resource elements" % (CHANNEL_NAMES[code - 1], int((labels == code).sum())))

    colours = ["#ffffff"] + [colour for _, colour in CHANNELS]
    figure = new_figure()
    axes = figure.add_subplot(1, 1, 1)
    axes.imshow(view.T, origin="lower", aspect="auto", interpolation="nearest",
                cmap=ListedColormap(colours), vmin=-0.5, vmax=len(colours) - 0.5,
                extent=(-0.5, view.shape[0] - 0.5, first - half - point_a - 0.5, last - half - point_a - 0.5))
    symbols_per_slot = 12 if carrier.get("CPType") == "Extended" else 14
    slots = view.shape[0] // symbols_per_slot
    axes.set_xticks(np.arange(0, view.shape[0] + 1, symbols_per_slot * max(1, slots // 20)))
    axes.set_xlabel("OFDM symbol in frame 0 (%d slots of %d symbols)" % (slots, symbols_per_slot))
    axes.set_ylabel("subcarrier from point A")
    handles = [plt.Rectangle((0, 0), 1, 1, color=CHANNELS[code - 1][1]) for code in present]
    if handles:
        axes.legend(handles, [CHANNEL_NAMES[code - 1] for code in present], loc="upper left",
                    bbox_to_anchor=(1.01, 1.0), fontsize=9)
    axes.set_title("Resource grid of carrier %d, antenna 0, frame 0" % carrier_index)
    figure.subplots_adjust(left=0.08, right=0.84)
    save(figure, out)


# ---------------------------------------------------------------- constellations


def constellation_sets(folder):
    """(title, data symbols, DM-RS symbols) per channel item found in the export."""
    stages = stage_folder(folder)
    names = sorted(os.listdir(stages))
    found = []
    for name in names:
        if not name.endswith("_Mod_Out.txt") and not name.endswith("PRS0_Out.txt"):
            continue
        stem = name[:-len("_Mod_Out.txt")] if name.endswith("_Mod_Out.txt") else name[:-len("_Out.txt")]
        data = read_complex(os.path.join(stages, name))
        dmrs_path = os.path.join(stages, stem + "_DMRS.txt")
        dmrs = read_complex(dmrs_path) if os.path.isfile(dmrs_path) else np.zeros(0, complex)
        if len(data) or len(dmrs):
            title = stem.split("_Tx_", 1)[-1].replace("CSI_RS", "CSI-RS ").replace("PBCH", "PBCH ")
            title = title.replace("PDCCH", "PDCCH ").replace("PDSCH", "PDSCH ").replace("PRS", "PRS ")
            found.append((title.replace("  ", " ").strip(), data, dmrs))
    return found


def plot_constellation(cli, tree, carrier_index, out, limit=20000):
    check_carrier(tree, carrier_index)
    with tempfile.TemporaryDirectory(prefix="nrsynth_constellation_") as work:
        finish(export_frame(cli, tree, work, carrier_index), "the document")
        sets = constellation_sets(work)
    if not sets:
        raise PlotError("carrier %d exports no modulated symbols" % carrier_index)
    columns = int(np.ceil(np.sqrt(len(sets))))
    rows = int(np.ceil(len(sets) / columns))
    figure = new_figure()
    for position, (title, data, dmrs) in enumerate(sets, start=1):
        axes = figure.add_subplot(rows, columns, position)
        for values, colour, label in ((data, "C0", "data"), (dmrs, "C3", "DM-RS")):
            values = values[values != 0]
            if len(values) > limit:
                values = values[np.linspace(0, len(values) - 1, limit).astype(int)]
            if len(values):
                axes.plot(values.real, values.imag, ".", ms=2, color=colour, label=label)
        axes.set_title(title, fontsize=9)
        axes.set_aspect("equal", adjustable="datalim")
        axes.tick_params(labelsize=7)
        axes.grid(True, alpha=0.3)
        print("%s: %d symbols, %d DM-RS" % (title, len(data), len(dmrs)))
    figure.suptitle("Constellations of carrier %d, frame 0 (data blue, DM-RS red)" % carrier_index)
    figure.tight_layout()
    save(figure, out)


# ---------------------------------------------------------------- command line


def main(argv):
    parser = argparse.ArgumentParser(prog="nrsynth plot", description=__doc__.splitlines()[0])
    parser.add_argument("wave", help="sample file (complex double) written by nrsynth generate")
    parser.add_argument("--doc", help="the waveform document (JSON) the file was generated from")
    parser.add_argument("--kind", required=True, choices=KINDS)
    parser.add_argument("-o", "--output", required=True, help="picture to write (PNG)")
    parser.add_argument("--carrier", type=int, default=0, help="carrier of the grid and constellation kinds")
    parser.add_argument("--labels", help="grid: also write the channel of each element to this .npz")
    parser.add_argument("--nrsynth", help="the nrsynth executable (default: the one beside this script)")
    args = parser.parse_args(argv)
    if IMPORT_PROBLEM:
        raise PlotError("%s needs numpy and matplotlib (%s); on Debian: apt-get install python3-numpy "
                        "python3-matplotlib, or scripts/deps.sh" % (sys.executable, IMPORT_PROBLEM))
    cli = args.nrsynth or os.path.join(os.path.dirname(os.path.abspath(__file__)), "nrsynth")
    tree = load_document(cli, args.doc) if args.doc else None
    if args.kind in ("grid", "constellation") and tree is None:
        raise PlotError("--kind %s needs --doc WAVE.json: the grid is generated again from it" % args.kind)
    if args.kind == "grid":
        plot_grid(cli, tree, args.carrier, args.output, args.labels)
        return 0
    if args.kind == "constellation":
        plot_constellation(cli, tree, args.carrier, args.output)
        return 0
    samples = read_samples(args.wave)
    if args.kind == "spectrum":
        plot_spectrum(samples, tree, args.output)
    elif args.kind == "ccdf":
        plot_ccdf(samples, args.output)
    else:
        plot_power(samples, args.wave, tree, args.output)
    return 0


if __name__ == "__main__":
    try:
        sys.exit(main(sys.argv[1:]))
    except PlotError as problem:
        sys.stderr.write("nrsynth plot: %s\n" % problem)
        sys.exit(1)
