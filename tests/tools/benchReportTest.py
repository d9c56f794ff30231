#!/usr/bin/env python3
"""The report of a benchmark compares the right figures and counts the targets rightly."""

import json
import pathlib
import subprocess
import sys
import tempfile
import unittest

REPORT = pathlib.Path(__file__).resolve().parents[2] / "tools/benchReport.py"


def run_of(name, real, cpu, aggregate="median", unit="ns", threads=1, **counters):
    return {"run_name": name, "aggregate_name": aggregate, "threads": threads, "time_unit": unit,
            "real_time": real, "cpu_time": cpu, "iterations": 9, **counters}


class BenchReportTest(unittest.TestCase):
    def report(self, runs, targets):
        with tempfile.TemporaryDirectory() as folder:
            results, file = pathlib.Path(folder, "r.json"), pathlib.Path(folder, "targets.txt")
            results.write_text(json.dumps({"benchmarks": runs}))
            file.write_text(targets)
            run = subprocess.run([sys.executable, REPORT, results, file], capture_output=True,
                                 text=True)
        return run.returncode, run.stdout + run.stderr

    def test_tells_met_missed_and_unmeasured_targets_apart(self):
        _, text = self.report(
            [run_of("copy/ours", 9, 2), run_of("copy/ours", 9, 7, aggregate="mean"),
             run_of("copy/peer", 1, 2.0), run_of("lock/ours/threads:2", 3, 1, threads=2),
             run_of("lock/peer/threads:2", 2, 1, threads=2)],
            "# what is aimed at\ncopy, ours, peer, 1.0\nlock threads:2, ours, peer, 1.49\n"
            "find, ours, peer, 1\n")
        self.assertRegex(text, r"copy: ours to peer +1\.00  <= 1\.00  met")
        self.assertRegex(text, r"lock threads:2: ours to peer +1\.50  <= 1\.49  MISSED")
        self.assertRegex(text, r"find: ours to peer .*not measured")
        self.assertIn("1 of 3 targets met", text)

    def test_compares_counters_and_units(self):
        _, text = self.report(
            [run_of("wake/ours/real_time", 2, 1, unit="us", p99=30.0),
             run_of("wake/peer/real_time", 4000, 1, p99=10.0)],
            "wake, ours, peer, 0.5\nwake, ours, peer, 2, p99\n")
        self.assertRegex(text, r"wake: ours to peer +0\.50 .* met")
        self.assertRegex(text, r"wake p99: ours to peer +3\.00 .* MISSED")

    def test_compares_with_another_case(self):
        _, text = self.report(
            [run_of("lock/ours/threads:1", 10, 10), run_of("lock/peer/threads:1", 1, 1),
             run_of("lock/ours/threads:2", 6, 1, threads=2)],
            "lock threads:2, ours, lock/ours, 0.59\n")
        self.assertRegex(text, r"lock threads:2: ours to lock/ours +0\.60 .* MISSED")

    def test_refuses_a_line_it_cannot_read_and_an_empty_run(self):
        self.assertEqual(self.report([run_of("copy/ours", 1, 1)], "copy, ours\n")[0], 1)
        self.assertEqual(self.report([], "")[0], 1)


if __name__ == "__main__":
    unittest.main()
