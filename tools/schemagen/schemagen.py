#!/usr/bin/env python3
"""Generates the C++ class types, meta-data and provider glue of the module
from the DMTF classes it builds on and from its own MOF.

    schemagen.py --cim-mof PATH [--root DIR] [--check]

--cim-mof  the DMTF classes (cim_schema.mof)
--root     the repository root (default: two levels above this script); the
           module's MOF is read from <root>/schema/tavrin.mof and the output
           goes to <root>/schema/generated/ and <root>/providers/generated/
--check    write nothing; report every generated file that differs from what
           is on disk (or is missing, or is stale) and exit with 1 if any does
"""

import argparse
import os
import sys

sys.dont_write_bytecode = True  # keep the source tree clean
sys.path.insert(0, os.path.dirname(os.path.abspath(__file__)))

import emit_mof  # noqa: E402
import emit_providers  # noqa: E402
import emit_schema  # noqa: E402
import model  # noqa: E402
import mof  # noqa: E402

OUTPUT_DIRS = ["schema/generated", "providers/generated"]


def generate(cim_mof, root):
    cim = mof.parse_file(cim_mof)
    tavrin = mof.parse_file(os.path.join(root, "schema", "tavrin.mof"))
    schema = model.build(cim, tavrin)
    result = emit_schema.files(schema)
    result.update(emit_providers.files(schema))
    result.update(emit_mof.files(cim, tavrin))
    return result


def existing(root):
    found = set()
    for d in OUTPUT_DIRS:
        full = os.path.join(root, d)
        if os.path.isdir(full):
            for name in os.listdir(full):
                if os.path.isfile(os.path.join(full, name)):
                    found.add("%s/%s" % (d, name))
    return found


def read(path):
    try:
        with open(path, encoding="utf-8", newline="") as f:
            return f.read()
    except FileNotFoundError:
        return None


def main(argv):
    here = os.path.dirname(os.path.abspath(__file__))
    ap = argparse.ArgumentParser(description=__doc__.split("\n\n")[0])
    ap.add_argument("--cim-mof", required=True)
    ap.add_argument("--root", default=os.path.normpath(os.path.join(here, "..", "..")))
    ap.add_argument("--check", action="store_true")
    args = ap.parse_args(argv)

    try:
        files = generate(args.cim_mof, args.root)
    except (mof.MofError, OSError) as e:
        print("schemagen: %s" % e, file=sys.stderr)
        return 2

    stale = sorted(existing(args.root) - set(files))
    changed = sorted(p for p, text in files.items()
                     if read(os.path.join(args.root, p)) != text)
    if args.check:
        for p in changed:
            print("schemagen: out of date: %s" % p)
        for p in stale:
            print("schemagen: not generated any more: %s" % p)
        return 1 if changed or stale else 0

    for p in stale:
        os.remove(os.path.join(args.root, p))
    for p in changed:
        path = os.path.join(args.root, p)
        os.makedirs(os.path.dirname(path), exist_ok=True)
        with open(path, "w", encoding="utf-8", newline="") as f:
            f.write(files[p])
    print("schemagen: %d files, %d written, %d removed" % (len(files), len(changed), len(stale)))
    return 0


if __name__ == "__main__":
    sys.exit(main(sys.argv[1:]))
