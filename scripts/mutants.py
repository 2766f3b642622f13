#!/usr/bin/env python3
"""Mutation testing: breaks the code one small change at a time and checks that a test notices.

  scripts/mutants.py [--only REGEX] [--file REGEX] [--record] [--list] [SET.txt ...]

Reads the mutation sets (default: every tests/mutants/*.txt), copies the tree
into a scratch folder (default build-mutants/, or $QBR_MUTANTS_DIR), builds it
once and runs every named test program there unchanged (each must pass). Then,
for each mutation: replace its exact text in the scratch copy, rebuild the
targets that the named tests need, run those tests, put the text back. A mutant
is killed when a test fails (or the build breaks, which is counted apart: the
mutation should be rewritten), and survives when every test passes.

A mutation set is plain text, one block per mutation, blocks separated by blank
lines, `#` starts a comment line:

    [quick-help-period]
    file: quickhelp/quickhelp.cpp
    find: constexpr UINT kHelpPeriod = 200;
    replace: constexpr UINT kHelpPeriod = 300;
    tests: quickhelp_test
    equivalent: why no test can see the change (optional; the mutant is not run)

`find` must occur exactly once in `file`; `\\n`, `\\t` and `\\\\` in find and
replace stand for a line break, a tab and a backslash. `tests` names test
programs (`paint_test`, or `paint_test:Filter*` for a GoogleTest filter) and
end-to-end scripts (`demo_journey_e2e`), separated by blanks. A program named
with a display scale in front (`dpi144_dpi_test`) runs in the scratch build's
prefix for that DPI, as its CTest entry does.

--only REGEX   runs the mutants whose name matches
--file REGEX   runs the mutants whose file matches (say, what a change touched)
--record       writes each set's score and survivors to tests/mutants/RESULTS.md (whole sets only)
--list         prints the mutants and checks that every `find` is there, runs nothing
"""
import argparse
import glob
import os
import re
import shutil
import subprocess
import sys
import time

HERE = os.path.dirname(os.path.dirname(os.path.abspath(__file__)))
TEST_TIMEOUT = 300
E2E_TIMEOUT = 600


class Mutant:
    def __init__(self, name, origin):
        self.name = name
        self.origin = origin
        self.file = ""
        self.find = ""
        self.replace = ""
        self.tests = []
        self.equivalent = ""


def unescape(text):
    out = []
    i = 0
    while i < len(text):
        c = text[i]
        if c == "\\" and i + 1 < len(text):
            nxt = text[i + 1]
            out.append({"n": "\n", "t": "\t", "\\": "\\"}.get(nxt, "\\" + nxt))
            i += 2
            continue
        out.append(c)
        i += 1
    return "".join(out)


def parse_set(path):
    mutants = []
    current = None
    rel = os.path.relpath(path, HERE)
    with open(path, encoding="utf-8") as f:
        for number, line in enumerate(f, 1):
            line = line.rstrip("\n")
            if not line.strip() or line.lstrip().startswith("#"):
                continue
            m = re.match(r"^\[(.+)\]$", line.strip())
            if m:
                current = Mutant(m.group(1), "%s:%d" % (rel, number))
                mutants.append(current)
                continue
            key, sep, value = line.partition(":")
            if not sep or current is None:
                sys.exit("%s:%d: expected [name] or key: value" % (rel, number))
            key = key.strip()
            value = value[1:] if value.startswith(" ") else value
            if key == "file":
                current.file = value.strip()
            elif key == "find":
                current.find = unescape(value)
            elif key == "replace":
                current.replace = unescape(value)
            elif key == "tests":
                current.tests = value.split()
            elif key == "equivalent":
                current.equivalent = value.strip()
            else:
                sys.exit("%s:%d: unknown key %r" % (rel, number, key))
    for m in mutants:
        if not m.file or not m.find or (not m.tests and not m.equivalent):
            sys.exit("%s: mutant %s needs file, find and tests" % (m.origin, m.name))
        if m.find == m.replace:
            sys.exit("%s: mutant %s changes nothing" % (m.origin, m.name))
    return mutants


def check_place(m, root):
    path = os.path.join(root, m.file)
    if not os.path.isfile(path):
        return "no file %s" % m.file
    with open(path, encoding="utf-8", newline="") as f:
        count = f.read().count(m.find)
    if count != 1:
        return "its text stands %d times in %s (must be once)" % (count, m.file)
    return ""


def run(cmd, timeout, log, env=None, cwd=None):
    with open(log, "a") as out:
        out.write("\n$ %s\n" % " ".join(cmd))
        out.flush()
        try:
            p = subprocess.Popen(cmd, stdout=out, stderr=subprocess.STDOUT, stdin=subprocess.DEVNULL,
                                 env=env, cwd=cwd, start_new_session=True)
            return p.wait(timeout=timeout)
        except subprocess.TimeoutExpired:
            os.killpg(p.pid, 9)
            p.wait()
            out.write("(timed out after %d s)\n" % timeout)
            return 124


def test_targets(tests):
    targets = {"qbr_keeper", "qbr_ctl"}
    for t in tests:
        name = t.split(":")[0]
        if name.endswith("_e2e"):
            targets.update({"qbrdemo", "qbr_reader"})  # the journeys also read the demo as a screen reader
        else:
            targets.add(scaled_test(name)[1])
    return sorted(targets)


def scaled_test(name):
    """(DPI, program) of a test name: dpi144_dpi_test is dpi_test at 144."""
    m = re.match(r"dpi(\d+)_(.+)$", name)
    return (m.group(1), m.group(2)) if m else ("96", name)


def run_tests(tests, src, build, log):
    """Gives the first test that failed, or ''."""
    env = dict(os.environ, QBR_SOURCE_DIR=src, QBR_BUILD_DIR=build)
    for t in tests:
        name, _, flt = t.partition(":")
        if name.endswith("_e2e"):
            cmd = ["bash", os.path.join(src, "tests", "e2e", name + ".sh"), build]
            timeout = E2E_TIMEOUT
        else:
            dpi, program = scaled_test(name)
            env["QBR_EXPECT_DPI"] = dpi
            cmd = [os.path.join(src, "scripts", "wine-run.sh"), "--dpi", dpi, build,
                   os.path.join(build, "bin", program + ".exe"), "--gtest_brief=1"]
            if flt:
                cmd.append("--gtest_filter=" + flt)
            timeout = TEST_TIMEOUT
        if run(cmd, timeout, log, env=env, cwd=os.path.join(build, "tests")) != 0:
            return t
    return ""


RESULTS = os.path.join(HERE, "tests", "mutants", "RESULTS.md")
COLUMNS = "| set | date | mutants | killed | survived | did not build | equivalent (not run) | score | survivors |"


def record(mutants, killed, survived, broken):
    """Writes one row per set that this run covered into RESULTS.md, keeping
    the rows of the other sets, and a total over all rows."""
    rows = {}
    if os.path.exists(RESULTS):
        with open(RESULTS, encoding="utf-8") as f:
            for line in f:
                cells = [c.strip() for c in line.strip().strip("|").split("|")]
                if len(cells) == 9 and cells[0].startswith("tests/mutants/"):
                    rows[cells[0]] = cells
    today = time.strftime("%Y-%m-%d")
    for origin in sorted({m.origin.split(":")[0] for m in mutants}):
        mine = [m for m in mutants if m.origin.startswith(origin + ":")]
        k = sum(m in killed for m in mine)
        s = [m.name for m in mine if m in survived]
        b = sum(m in broken for m in mine)
        e = sum(bool(m.equivalent) for m in mine)
        score = 100.0 * k / (k + len(s)) if k + len(s) else 100.0
        rows[origin] = [origin, today, str(len(mine)), str(k), str(len(s)), str(b), str(e),
                        "%.1f %%" % score, ", ".join(s) or "none"]
    total = [sum(int(r[i]) for r in rows.values()) for i in range(2, 7)]
    judged = total[1] + total[2]
    with open(RESULTS, "w", encoding="utf-8") as f:
        f.write("# Mutation score\n\n")
        f.write("Written by `python3 scripts/mutants.py --record`: one row per set, from the last run that\n"
                "covered the whole set; a run of some sets replaces their rows only.\n\n")
        f.write(COLUMNS + "\n|" + "---|" * 9 + "\n")
        for key in sorted(rows):
            f.write("| " + " | ".join(rows[key]) + " |\n")
        f.write("| all | | %d | %d | %d | %d | %d | %.1f %% | |\n"
                % tuple(total + [100.0 * total[1] / judged if judged else 100.0]))


def main():
    ap = argparse.ArgumentParser(description=__doc__, formatter_class=argparse.RawDescriptionHelpFormatter)
    ap.add_argument("sets", nargs="*")
    ap.add_argument("--only")
    ap.add_argument("--file")
    ap.add_argument("--record", action="store_true")
    ap.add_argument("--list", action="store_true")
    args = ap.parse_args()

    sets = args.sets or sorted(glob.glob(os.path.join(HERE, "tests", "mutants", "*.txt")))
    mutants = []
    for s in sets:
        mutants += parse_set(s)
    names = [m.name for m in mutants]
    doubles = sorted({n for n in names if names.count(n) > 1})
    if doubles:
        sys.exit("mutant names used twice: " + ", ".join(doubles))
    if args.only:
        mutants = [m for m in mutants if re.search(args.only, m.name)]
    if args.file:
        mutants = [m for m in mutants if re.search(args.file, m.file)]
    if args.record and (args.only or args.file):
        sys.exit("--record takes whole sets: name set files instead of --only or --file")

    stale = [(m, check_place(m, HERE)) for m in mutants]
    stale = [(m, why) for m, why in stale if why]
    if args.list:
        for m in mutants:
            mark = "equivalent" if m.equivalent else " ".join(m.tests)
            print("%-40s %-32s %s" % (m.name, m.file, mark))
        for m, why in stale:
            print("STALE %s (%s): %s" % (m.name, m.origin, why))
        print("%d mutants, %d stale" % (len(mutants), len(stale)))
        return 1 if stale else 0
    if stale:
        for m, why in stale:
            print("STALE %s (%s): %s" % (m.name, m.origin, why))
        return 2

    scratch = os.path.abspath(os.environ.get("QBR_MUTANTS_DIR", os.path.join(HERE, "build-mutants")))
    src = os.path.join(scratch, "src")
    build = os.path.join(scratch, "build")
    log = os.path.join(scratch, "log.txt")
    os.makedirs(scratch, exist_ok=True)
    open(log, "w").close()
    print("scratch copy: %s (log: %s)" % (scratch, log))
    # The scratch copy follows the working tree, uncommitted changes included.
    # Files are compared by content and a changed one is written with the time
    # of the copy, not its own: an edit made while an earlier run was building
    # is older than that run's objects, and would otherwise not be rebuilt.
    subprocess.check_call(["rsync", "-rlDE", "--checksum", "--delete", "--exclude", ".git", "--exclude", "/build*",
                           HERE + "/", src + "/"])
    if run(["cmake", "-S", src, "-B", build, "-DQBR_BUILD_BENCH=OFF"], 600, log) != 0:
        sys.exit("configure failed, see %s" % log)

    live = [m for m in mutants if not m.equivalent]
    all_tests = sorted({t for m in live for t in m.tests})
    jobs = str(os.cpu_count() or 2)
    print("building and running the unchanged tree: %s" % " ".join(all_tests))
    if run(["cmake", "--build", build, "-j", jobs, "--target"] + test_targets(all_tests), 1800, log) != 0:
        sys.exit("the unchanged tree does not build, see %s" % log)
    failed = run_tests(all_tests, src, build, log)
    if failed:
        sys.exit("%s fails on the unchanged tree, see %s" % (failed, log))

    killed, survived, broken = [], [], []
    started = time.time()
    for i, m in enumerate(live, 1):
        path = os.path.join(src, m.file)
        with open(path, encoding="utf-8", newline="") as f:
            original = f.read()
        try:
            with open(path, "w", encoding="utf-8", newline="") as f:
                f.write(original.replace(m.find, m.replace, 1))
            with open(log, "a") as out:
                out.write("\n==== %s (%s)\n" % (m.name, m.origin))
            if run(["cmake", "--build", build, "-j", jobs, "--target"] + test_targets(m.tests), 1800, log) != 0:
                verdict, by = "broken", "the build"
                broken.append(m)
            else:
                by = run_tests(m.tests, src, build, log)
                verdict = "killed" if by else "SURVIVED"
                (killed if by else survived).append(m)
        finally:
            with open(path, "w", encoding="utf-8", newline="") as f:
                f.write(original)
        print("[%d/%d] %-8s %s%s" % (i, len(live), verdict, m.name, " (by %s)" % by if by else ""), flush=True)

    equivalent = [m for m in mutants if m.equivalent]
    judged = len(killed) + len(survived)
    score = 100.0 * len(killed) / judged if judged else 100.0
    print("\nkilled %d, survived %d, did not build %d, equivalent (not run) %d: score %.1f %% (%.0f s)"
          % (len(killed), len(survived), len(broken), len(equivalent), score, time.time() - started))
    for m in survived:
        print("  survived: %s (%s)" % (m.name, m.origin))
    for m in broken:
        print("  did not build: %s (%s)" % (m.name, m.origin))

    if args.record:
        record(mutants, killed, survived, broken)
    return 0 if not survived and not broken else 1


if __name__ == "__main__":
    sys.exit(main())
