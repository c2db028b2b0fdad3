#!/usr/bin/env python3
"""Runs the benchmarks and prints each subject as a ratio to its baseline of the same run.

A benchmark named "ROW/subject" is held against the one named "ROW/baseline". A row that is a count, not a time (the
user counter "count"), is printed as it is. The limit of each row stands here, with its meaning, and nowhere else; those
of the window stand with the way they are measured, in desktop.py.
"""

import argparse
import json
import shutil
import subprocess
import sys

import desktop

# row: (what the subject is, what it is held against, the ratio that must not be passed)
ROWS = {
    "idle_step": ("one idle step, 1000 bodies, four 640x360 views", "bare viewer frame over the same graph", 1.10),
    "apply_frames": ("ApplyFrames, 10,000 channels", "plain loop that copies and sets matrices", 1.5),
    "get_at_time": ("GetAtTime, random, 1,000,000 frames", "the same with 1,000 frames", 3.0),
    "load_mdf": ("loading a 200 MB .mdf", "read of the same bytes", 2.0),
    "idle_step_allocations": ("heap allocations in a steady idle step", "those of a bare viewer's frame", 0.0),
    "build_scene": ("scene of 1000 bodies over 10 models", "reading the 10 models once", 2.0),
    "preload_models": ("10 models read at once", "one after another", 1.2),
    "read_model": ("a model read in a process of its own", "library's reader in this process", 12.0),
    "update_observers": ("Update of 100 observers in smooth follow", "100 matrix products and inverses", 8.0),
    "load_scene": ("loading a scene file, 1000 bodies over 10 models", "the same scene built by the program", 1.5),
    "save_scene": ("saving that scene", "one write of the same bytes, and fsync", 3.0),
    "load_records": ("loading a scene file of 10,000 records", "the same with 1,000", 12.0),
    "four_panes": ("one frame of the example in four panes", "bare viewer frame, same graph and cameras", 1.10),
    "read_model_cached": ("a finished model taken from the cache", "library's reader in this process", 0.5),
}


def run(program: str, repetitions: int, row_filter: str) -> dict:
    command = [program, "--benchmark_format=json", f"--benchmark_repetitions={repetitions}",
               "--benchmark_enable_random_interleaving=true", f"--benchmark_filter={row_filter}"]
    output = subprocess.run(command, stdout=subprocess.PIPE, check=True).stdout
    return json.loads(output or '{"benchmarks": []}')  # no name matched


def medians(report: dict) -> dict:
    """Median real time in nanoseconds by benchmark name, with the user counters."""
    unit = {"ns": 1.0, "us": 1e3, "ms": 1e6, "s": 1e9}
    result = {}
    for entry in report["benchmarks"]:
        if entry.get("aggregate_name") == "median":
            name = "/".join(entry["run_name"].split("/")[:2])
            result[name] = {"ns": entry["real_time"] * unit[entry["time_unit"]], "count": entry.get("count")}
    return result


def rows(measured: dict) -> list:
    table = []
    for row, (subject, baseline, limit) in ROWS.items():
        top = measured.get(f"{row}/subject")
        if top is None:
            continue
        if top["count"] is not None:
            table.append({"row": row, "subject": subject, "baseline": baseline, "value": top["count"], "limit": limit})
            continue
        bottom = measured[f"{row}/baseline"]
        table.append({"row": row, "subject": subject, "baseline": baseline, "subject_ns": top["ns"],
                      "baseline_ns": bottom["ns"], "value": top["ns"] / bottom["ns"], "limit": limit})
    return table


def reached(entry: dict) -> bool:
    return entry["value"] >= entry["limit"] if entry.get("least") else entry["value"] <= entry["limit"]


def main() -> int:
    parser = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    parser.add_argument("--program", default="build/release/bin/panoramic_bench")
    parser.add_argument("--json", metavar="FILE", help="write the table as JSON too")
    parser.add_argument("--rows", default=".", metavar="REGEX", help="only benchmarks whose name matches")
    parser.add_argument("--repetitions", type=int, default=5)
    arguments = parser.parse_args()

    table = rows(medians(run(arguments.program, arguments.repetitions, arguments.rows)))
    if shutil.which("Xvfb"):
        table += desktop.rows(arguments.rows)
    else:
        print("bench: the rows of the window are left out, since there is no Xvfb", file=sys.stderr)
    if not table:
        print("bench: no row matches", file=sys.stderr)
        return 2
    print(f"{'subject':48} {'baseline':42} {'ratio':>7} {'reach':>6}")
    for entry in table:
        verdict = "" if reached(entry) else "  MISSED"
        print(f"{entry['subject']:48} {entry['baseline']:42} {entry['value']:7.2f} {entry['limit']:6.2f}{verdict}")
    if arguments.json:
        with open(arguments.json, "w", encoding="utf-8") as file:
            json.dump({"rows": table}, file, indent=2)
    return 0 if all(map(reached, table)) else 1


if __name__ == "__main__":
    sys.exit(main())
