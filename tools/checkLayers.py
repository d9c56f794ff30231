#!/usr/bin/env python3
"""Checks that the sources keep to layers.txt.

Reports, as "file:line: what is wrong", every include of a header that the file's module may not
use, headers of one name, files whose name says that they belong into another module, and headers
that include each other in a circle. With an argument, checks the tree in that folder.
"""

import pathlib
import re
import sys

INCLUDE = re.compile(r'^\s*#\s*include\s+(?:"([^"]+)"|<orv/([^>]+)>)')

# The prefix of a class's name says where it lives; the longest that fits counts. A prefix is
# followed by a capital: "lkMutex" has the prefix "lk".
FOLDERS = {
    "li": ["core"], "rc": ["base", "core"], "in": ["base"], "lk": ["locks"], "mt": ["threads"],
    "mb": ["memory"], "da": ["memory"], "dev": ["statemachine", "kit", "manager"],
    "devMD": ["kit"], "devMDStd": ["kit"], "devMgr": ["manager"], "devSM": ["statemachine"],
    "devSeq": ["kit", "manager", "statemachine"], "se": ["sync"], "xml": ["xml"],
    "priority": ["priorities"], "rt": ["priorities"],
}
# The exceptions of the device layer stand below it, with the state machines, which throw them too.
# The container asks the graph of the device kit's waits, and only the device queues are made of it.
PLACED_BY_HAND = {"devMgrEx": ["statemachine"], "devPrtclEx": ["statemachine"],
                  "mtContainer": ["kit"]}


class Tree:
    """The sources of all modules, with what they include."""

    def __init__(self, root):
        self.root = root
        self.uses = read_layers(root / "layers.txt")
        self.files = {}  # module: its files
        for module in self.uses:
            folder = root / "src" / ("base" if module == "base" else f"resmgt/{module}")
            self.files[module] = sorted(
                path for path in folder.rglob("*") if path.suffix in (".h", ".cpp", ".imp"))
        self.module_of = {}  # header's name: its module
        for module, files in self.files.items():
            for path in files:
                if path.suffix != ".cpp":
                    self.module_of.setdefault(path.name, module)

    def name(self, path):
        return path.relative_to(self.root).as_posix()

    def includes(self, path):
        """The project's headers that a file includes, as (line, name)."""
        text = path.read_text(encoding="utf-8")
        for number, line in enumerate(text.splitlines(), 1):
            match = INCLUDE.match(line)
            if match:
                yield number, match[1] or match[2]


def read_layers(path):
    uses = {}
    for line in path.read_text(encoding="utf-8").splitlines():
        match = re.match(r"^([a-z]+):(.*)$", line)
        if match:
            uses[match[1]] = match[2].split()
    return uses


def find_upward_includes(tree):
    for module, files in tree.files.items():
        for path in files:
            for number, header in tree.includes(path):
                place = f"{tree.name(path)}:{number}"
                owner = tree.module_of.get(pathlib.PurePath(header).name)
                if "/" in header:
                    yield f'{place}: "{header}": an include is the bare file name'
                elif owner is None:
                    yield f'{place}: "{header}" is no header of any module'
                elif owner != module and owner not in tree.uses[module]:
                    yield (f'{place}: "{header}" is of module {owner}, '
                           f"which {module} may not use")


def find_stray_files(tree):
    known = {path for files in tree.files.values() for path in files}
    for path in sorted((tree.root / "src").rglob("*")):
        if path.suffix in (".h", ".cpp", ".imp") and path not in known:
            yield f"{tree.name(path)}:1: lies in no module of layers.txt"


def find_shared_names(tree):
    first = {}
    for files in tree.files.values():
        for path in files:
            if path.suffix == ".cpp":
                continue
            other = first.setdefault(path.name.lower(), path)
            if other != path:
                yield f"{tree.name(path)}:1: has the name of {tree.name(other)}"


def find_misplaced_files(tree):
    for module, files in tree.files.items():
        for path in files:
            stem = path.name.split(".")[0]
            prefixes = [prefix for prefix in FOLDERS
                        if re.match(prefix + r"(?=[A-Z]|$)", stem)]
            if not prefixes:
                continue
            folders = PLACED_BY_HAND.get(stem, FOLDERS[max(prefixes, key=len)])
            if module not in folders:
                yield (f"{tree.name(path)}:1: belongs by its name into "
                       f"{' or '.join(folders)}, not {module}")


def find_circles(tree):
    edges = {}
    for files in tree.files.values():
        for path in files:
            if path.suffix != ".cpp":
                edges[path.name] = [header for _, header in tree.includes(path)]
    done, path = set(), []

    def visit(header):
        if header in path:
            yield " -> ".join(path[path.index(header):] + [header])
            return
        if header in done:
            return
        path.append(header)
        for included in edges.get(header, []):
            # A template's bodies include the header that includes them.
            if {pathlib.PurePath(header).suffix, pathlib.PurePath(included).suffix} != {".h", ".imp"}:
                yield from visit(included)
        path.pop()
        done.add(header)

    for header in sorted(edges):
        for circle in visit(header):
            yield f"{tree.name(locate(tree, header))}:1: headers include each other: {circle}"


def locate(tree, header):
    return next(path for files in tree.files.values() for path in files if path.name == header)


def main():
    default = pathlib.Path(__file__).resolve().parent.parent
    tree = Tree(pathlib.Path(sys.argv[1]).resolve() if len(sys.argv) > 1 else default)
    checks = [find_upward_includes, find_stray_files, find_shared_names, find_misplaced_files,
              find_circles]
    faults = [fault for check in checks for fault in check(tree)]
    for fault in faults:
        print(fault)
    nb_files = sum(len(files) for files in tree.files.values())
    print(f"{nb_files} files of {len(tree.uses)} modules, {len(faults)} faults")
    return 1 if faults else 0


if __name__ == "__main__":
    sys.exit(main())
