#!/usr/bin/env python3
"""The layering check finds each fault that is planted in a small tree."""

import pathlib
import subprocess
import sys
import tempfile
import unittest

CHECK = pathlib.Path(__file__).resolve().parents[2] / "tools/checkLayers.py"


class CheckLayersTest(unittest.TestCase):
    def setUp(self):
        folder = tempfile.TemporaryDirectory()
        self.addCleanup(folder.cleanup)
        self.root = pathlib.Path(folder.name)
        self.write("layers.txt", "# a comment\nbase:\nlocks: base\nthreads: base locks\n")
        self.write("src/base/exBase.h", "#include <string>\n")
        self.write("src/resmgt/locks/lkMutex.h", '#pragma once\n#include "exBase.h"\n')
        self.write("src/resmgt/threads/mtThread.h", '#include "lkMutex.h"\n#include "mtThread.imp"\n')
        self.write("src/resmgt/threads/mtThread.imp", '#include "mtThread.h"\n')

    def write(self, name, text):
        path = self.root / name
        path.parent.mkdir(parents=True, exist_ok=True)
        path.write_text(text, encoding="utf-8")

    def check(self):
        run = subprocess.run([sys.executable, CHECK, self.root], capture_output=True, text=True)
        self.assertEqual(run.stderr, "")
        faults = run.stdout.splitlines()[:-1]
        self.assertEqual(run.returncode, 1 if faults else 0)
        return faults

    def test_a_right_tree_has_no_faults(self):
        self.assertEqual(self.check(), [])

    def test_finds_an_upward_include(self):
        self.write("src/resmgt/locks/lkSema.cpp", '#include "lkMutex.h"\n\n#  include "mtThread.h"\n')
        self.write("src/base/trace.cpp", "#include <orv/lkMutex.h>\n")
        self.assertEqual(self.check(), [
            'src/base/trace.cpp:1: "lkMutex.h" is of module locks, which base may not use',
            'src/resmgt/locks/lkSema.cpp:3: "mtThread.h" is of module threads, '
            'which locks may not use'])

    def test_finds_an_unknown_header_and_a_path(self):
        self.write("src/base/trace.cpp", '#include "nowhere.h"\n#include "../base/exBase.h"\n')
        self.assertEqual(self.check(), [
            'src/base/trace.cpp:1: "nowhere.h" is no header of any module',
            'src/base/trace.cpp:2: "../base/exBase.h": an include is the bare file name'])

    def test_finds_files_in_a_wrong_place(self):
        self.write("src/resmgt/locks/mtTask.h", "")
        self.write("src/resmgt/lists/list.h", "")
        self.write("src/resmgt/threads/ExBase.h", "")
        self.assertEqual(self.check(), [
            "src/resmgt/lists/list.h:1: lies in no module of layers.txt",
            "src/resmgt/threads/ExBase.h:1: has the name of src/base/exBase.h",
            "src/resmgt/locks/mtTask.h:1: belongs by its name into threads, not locks"])

    def test_finds_a_circle_of_headers(self):
        self.write("src/base/exBase.h", '#include "trace.h"\n')
        self.write("src/base/trace.h", '#include "exBase.h"\n')
        self.assertEqual(self.check(), [
            "src/base/exBase.h:1: headers include each other: exBase.h -> trace.h -> exBase.h"])


if __name__ == "__main__":
    unittest.main()
