#!/usr/bin/env python3
"""Runs the benchmarks and prints one table: each speed target, what this machine measured
and whether it holds.

The benchmark program runs twice: with glibc's mmap threshold off (every large block comes
from the heap), and with the heap also kept between rounds (glibc otherwise hands freed
memory at the top of the heap back to the kernel, so each round pays the page faults of
its large results again). Both columns are printed; a verdict says which of them meet the target.
Usage: bench-table.py BENCH_BINARY [--benchmark_filter=REGEX]
"""
import json
import os
import subprocess
import sys
import tempfile

RUNS = [
    ("heap", "glibc.malloc.mmap_max=0"),
    ("heap kept", "glibc.malloc.mmap_max=0:glibc.malloc.trim_threshold=4000000000"),
]


def run(binary, tunables, extra):
    with tempfile.NamedTemporaryFile(suffix=".json", delete=False) as out:
        path = out.name
    env = dict(os.environ, GLIBC_TUNABLES=tunables)
    subprocess.run([binary, "--benchmark_out=" + path, "--benchmark_out_format=json"] + extra,
                   env=env, check=True, stdout=subprocess.DEVNULL)
    with open(path) as f:
        data = json.load(f)
    os.unlink(path)
    results = {}
    for entry in data["benchmarks"]:
        if entry.get("run_type") == "aggregate" and entry.get("aggregate_name") != "median":
            continue
        name = entry.get("run_name", entry["name"])
        results[name] = entry
    return results


def find(results, prefix):
    for name, entry in results.items():
        if name.startswith(prefix):
            return entry
    return None


def counter(name, key, scale=1.0):
    def get(results):
        entry = find(results, name)
        return None if entry is None or key not in entry else entry[key] * scale
    return get


def gbps(name):
    return counter(name, "bytes_per_second", 1e-9)


def growth(small, large, key="ours_ms"):
    """Time for ten times the work over time for the work."""
    def get(results):
        a, b = find(results, small), find(results, large)
        if a is None or b is None:
            return None
        return b[key] / a[key] if key in a else b["real_time"] / a["real_time"]
    return get


AT_MOST, AT_LEAST = "<=", ">="

# label, value, comparison, target
ROWS = [
    ("first ParseRs / pugixml: 10,000 customer responses",
     counter("BM_CustomerFirstParse/10000", "ratio"), AT_MOST, 0.6),
    ("first ParseRs / pugixml: 50,000 customer responses",
     counter("BM_CustomerFirstParse/50000", "ratio"), AT_MOST, 0.6),
    ("first ParseRs / pugixml: one response, 10,000 customers",
     counter("BM_CustomerListFirstParse/10000", "ratio"), AT_MOST, 0.6),
    ("first ParseRs / pugixml: 50,000 inventory item responses",
     counter("BM_ItemInventoryFirstParse/50000", "ratio"), AT_MOST, 0.6),
    ("first ParseRs / pugixml: invoice of 5,000 lines",
     counter("BM_InvoiceParse/5000", "ratio"), AT_MOST, 0.6),
    ("every record, indexed / pugixml: 10,000 customers",
     counter("BM_CustomerEveryRecord/10000", "ratio"), AT_MOST, 4),
    ("every record, indexed / pugixml: 50,000 customers",
     counter("BM_CustomerEveryRecord/50000", "ratio"), AT_MOST, 4),
    ("every record, indexed / pugixml: 50,000 inventory items",
     counter("BM_ItemInventoryEveryRecord/50000", "ratio"), AT_MOST, 4),
    ("every record, indexed: us per customer (50,000)",
     counter("BM_CustomerEveryRecord/50000", "us_per_record"), AT_MOST, 7),
    ("every record, plain text: us per customer (1,000)",
     counter("BM_CustomerEveryRecordPlainText/1000", "us_per_record"), None, None),
    ("fromUtf8 / pugixml", counter("BM_FromUtf8/10000", "ratio"), AT_MOST, 0.3),
    ("toUtf8 / pugixml", counter("BM_ToUtf8/10000", "ratio"), AT_MOST, 0.3),
    ("escaping GB/s (10 MB)", gbps("BM_Escape/10"), AT_LEAST, 1),
    ("unescaping GB/s (10 MB)", gbps("BM_Unescape/10"), AT_LEAST, 1),
    ("builder GB/s (100,000 elements)", gbps("BM_BuilderDocument/100000"), AT_LEAST, 1),
    ("stand-in adds / plain SQLite loop", counter("BM_AddInvoices", "ratio"), AT_MOST, 1.25),
    ("stand-in ten-line invoices per second", counter("BM_AddInvoices", "ours_per_s"),
     AT_LEAST, 1000),
    ("stand-in 10,000-customer query, ms", counter("BM_CustomerQuery", "ms"), AT_MOST, 30),
    ("droqbxml send of that query, ms", counter("BM_CommandQuery", "ms"), AT_MOST, 80),
    ("Web Connector round trips per second (loopback, one client)",
     counter("BM_WebConnectorRoundTrip", "round_trips_per_s"), AT_LEAST, 500),
    ("Web Connector added latency per exchange, ms (median)",
     counter("BM_WebConnectorRoundTrip", "added_ms"), AT_MOST, 2),
    ("10x work: first ParseRs, customers 1,000 -> 10,000",
     growth("BM_CustomerFirstParse/1000", "BM_CustomerFirstParse/10000"), AT_MOST, 11),
    ("10x work: first ParseRs, inventory 5,000 -> 50,000",
     growth("BM_ItemInventoryFirstParse/5000", "BM_ItemInventoryFirstParse/50000"), AT_MOST, 11),
    ("10x work: invoice lines 500 -> 5,000",
     growth("BM_InvoiceParse/500", "BM_InvoiceParse/5000"), AT_MOST, 11),
    ("10x work: every record, customers 5,000 -> 50,000",
     growth("BM_CustomerEveryRecord/5000", "BM_CustomerEveryRecord/50000"), AT_MOST, 11),
    ("10x work: escaping 1 -> 10 MB", growth("BM_Escape/1", "BM_Escape/10", "real_time"),
     AT_MOST, 11),
    ("10x work: unescaping 1 -> 10 MB", growth("BM_Unescape/1", "BM_Unescape/10", "real_time"),
     AT_MOST, 11),
    ("10x work: builder 10,000 -> 100,000 elements",
     growth("BM_BuilderDocument/10000", "BM_BuilderDocument/100000", "real_time"), AT_MOST, 11),
]


def show(value):
    if value is None:
        return "-"
    return f"{value:.3g}" if value < 100 else f"{value:.0f}"


def main():
    binary = sys.argv[1]
    extra = sys.argv[2:]
    measured = [run(binary, tunables, extra) for _, tunables in RUNS]
    width = max(len(label) for label, *_ in ROWS)
    print(f"{'target':<{width}}  {'goal':>8}  " + "  ".join(f"{n:>9}" for n, _ in RUNS) + "  verdict")
    failed = [0] * len(RUNS)
    for label, value, comparison, target in ROWS:
        values = [value(results) for results in measured]
        goal = "" if target is None else f"{comparison} {target:g}"
        verdict = ""
        if target is not None and None not in values:
            holds = [v <= target if comparison == AT_MOST else v >= target for v in values]
            if all(holds):
                verdict = "met"
            elif any(holds):
                verdict = "met: " + RUNS[holds.index(True)][0] + " only"
            else:
                verdict = "NOT MET"
            for column, held in enumerate(holds):
                failed[column] += 0 if held else 1
        print(f"{label:<{width}}  {goal:>8}  " + "  ".join(f"{show(v):>9}" for v in values) +
              f"  {verdict}")
    print("\ntargets not met: " + ", ".join(f"{n} {f}" for (n, _), f in zip(RUNS, failed)))


if __name__ == "__main__":
    main()
