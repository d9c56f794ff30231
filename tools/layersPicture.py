#!/usr/bin/env python3
"""Prints layers.txt as a Graphviz graph; `tred` leaves the arrows that say something new."""

import pathlib
import re

CONTENTS = {
    "base": "libORVbase: exceptions, assertions,\\ntracing, logging, time, start-up order",
    "locks": "locks: mutexes, conditions,\\nevents, gates, counters",
    "core": "core: strings, counted pointers,\\nUUIDs, dates, timecodes",
    "priorities": "priorities: relations between\\nnamed priorities, solved",
    "threads": "threads: threads, pools,\\ntasks, alarms",
    "memory": "memory: buffers, managers,\\narenas",
    "statemachine": "statemachine: tables\\nand their engine",
    "sync": "sync: clocks that\\npace clients",
    "xml": "xml: writer",
    "kit": "kit: the device side: properties,\\nstreams, request queues",
    "manager": "manager: registry, access\\nobjects, observers",
}


def main():
    layers = pathlib.Path(__file__).resolve().parent.parent / "layers.txt"
    print('digraph layers {\n  rankdir=TB; ranksep=0.35; nodesep=0.25;')
    print('  node [shape=box style="rounded,filled" fillcolor="#eef3fa" color="#5b7aa5" '
          'fontname="Helvetica" fontsize=11];\n  edge [color="#8a99ad" arrowsize=0.6];')
    for line in layers.read_text(encoding="utf-8").splitlines():
        match = re.match(r"^([a-z]+):(.*)$", line)
        if match:
            print(f'  {match[1]} [label="{CONTENTS.get(match[1], match[1])}"];')
            for used in match[2].split():
                print(f"  {match[1]} -> {used};")
    print("}")


if __name__ == "__main__":
    main()
