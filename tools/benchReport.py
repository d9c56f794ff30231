#!/usr/bin/env python3
"""Prints the medians of a benchmark run and compares them with the targets.

Usage: benchReport.py RESULTS.json [TARGETS.txt]

A benchmark is named "<case>/<library>". A line of the targets is "case, ours, peer, limit" with the
limit of ours / peer, and a counter such as p99 in a fifth field where that is compared instead of
the time. A peer in another case is written "<case>/<library>". "#" begins a comment.
"""

import json
import pathlib
import sys

# Parts that Google Benchmark adds to a name and that tell no two cases apart.
PLAIN = ("real_time", "manual_time", "process_time", "iterations:", "repeats:", "min_time:",
         "min_warmup_time:")
TO_NANOSECONDS = {"ns": 1, "us": 1e3, "ms": 1e6, "s": 1e9}
STANDARD_KEYS = {"iterations", "real_time", "cpu_time", "threads", "repetitions",
                 "family_index", "per_family_instance_index", "repetition_index"}


def split_name(run_name):
    """"contended/LkMutex/real_time/threads:2" is the case "contended threads:2" of LkMutex."""
    case, library, *rest = run_name.split("/")
    rest = [part for part in rest if part != "threads:1" and not part.startswith(PLAIN)]
    return " ".join([case, *rest]), library


def read_medians(path):
    """{(case, library): {"time": nanoseconds, counter: value}}, in the order they ran."""
    medians = {}
    text = path.read_text(encoding="utf-8")  # empty when no benchmark matched the filter
    for run in json.loads(text)["benchmarks"] if text else []:
        if run.get("aggregate_name") != "median" or "/" not in run["run_name"]:
            continue
        # The wall clock where threads share the work or the benchmark asked for it.
        is_wall = run["threads"] > 1 or "_time" in run["run_name"]
        time = run["real_time" if is_wall else "cpu_time"] * TO_NANOSECONDS[run["time_unit"]]
        counters = {key: value for key, value in run.items()
                    if isinstance(value, (int, float)) and key not in STANDARD_KEYS}
        medians[split_name(run["run_name"])] = {"time": time, **counters}
    return medians


def read_targets(path):
    for number, line in enumerate(path.read_text(encoding="utf-8").splitlines(), 1):
        fields = [field.strip() for field in line.split("#")[0].split(",")]
        if fields == [""]:
            continue
        if len(fields) not in (4, 5):
            sys.exit(f"{path}:{number}: not \"case, ours, peer, limit[, counter]\"")
        case, ours, peer, limit = fields[:4]
        yield case, ours, peer, float(limit), fields[4] if len(fields) == 5 else "time"


def find_peer(case, peer):
    """Case and library of a target's peer."""
    other, _, library = peer.rpartition("/")
    return other or case, library


def print_medians(medians):
    width = max(len(library) for _, library in medians)
    for case in dict.fromkeys(case for case, _ in medians):
        print(case)
        for (other, library), values in medians.items():
            if other != case:
                continue
            counters = "".join(f"  {name} {value:,.0f}" for name, value in values.items()
                               if name != "time")
            print(f"    {library:<{width}} {values['time']:>12,.2f} ns{counters}")


def print_targets(medians, targets):
    nb_met = 0
    print("\nTargets, as ratios of medians:")
    for case, ours, peer, limit, counter in targets:
        what = f"{case}{'' if counter == 'time' else ' ' + counter}: {ours} to {peer}"
        try:
            ratio = medians[case, ours][counter] / medians[find_peer(case, peer)][counter]
        except KeyError:
            print(f"    {what:<56}      -  <= {limit:.2f}  not measured")
            continue
        # As exact as it is printed: the measurement is no better.
        is_met = round(ratio, 2) <= limit
        nb_met += is_met
        print(f"    {what:<56} {ratio:>6.2f}  <= {limit:.2f}  {'met' if is_met else 'MISSED'}")
    print(f"{nb_met} of {len(targets)} targets met")


def main():
    medians = read_medians(pathlib.Path(sys.argv[1]))
    if not medians:
        sys.exit("no medians in the results: no benchmark matched")
    print_medians(medians)
    if len(sys.argv) > 2 and pathlib.Path(sys.argv[2]).exists():
        print_targets(medians, list(read_targets(pathlib.Path(sys.argv[2]))))


if __name__ == "__main__":
    main()
