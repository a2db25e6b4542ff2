"""The test cases of a room, each run in a process of its own: which changed places it reaches, and how long it takes."""

import concurrent.futures
import os
import pathlib
import resource
import signal
import subprocess
import tempfile
import time
from typing import NamedTuple

TEST_PROGRAMS = {
    "common": ["common/common_test"],
    "libobd": ["libobd/libobd_test"],
    # The tables and texts of reports are asked for among the program's views.
    "libvelmora": ["libvelmora/libvelmora_test", "program/program_test", "e2e/e2e_test"],
    "program": ["program/program_test", "e2e/e2e_test"],
    "simulator": ["simulator/simulator_test"],
}
WAITING = {"e2e/e2e_test"}  # in real time: their cases run side by side, and only if the others notice nothing
VELMORA = [(f"python3 tests/e2e/{name}.py", ["program/velmora"]) for name in ("commandline", "commandtexts")]
BLUETOOTH = ("/usr/bin/python3 tests/e2e/bluetooth/bluetooth_test.py",
             ["program/velmora", "simulator/program/obdsim", "tests/e2e/bluetooth/home"])
SCRIPTS = {  # tests that are no test program, and what of the build they are given
    "libvelmora": VELMORA + [BLUETOOTH],
    "program": VELMORA + [("python3 tests/e2e/livekeys.py", ["program/velmora"]), ("bash tests/e2e/screen.sh", ["program/velmora"]),
                          BLUETOOTH],
    "simulator": [(f"python3 tests/simulator/{name}.py", ["simulator/program/obdsim"])
                  for name in ("commandline", "outsideclient")],
}
NUMBERS = 16384  # of changes, as in switch.h
BATCH = 4  # seconds of cases in a batch, each run alone
MOST_MEMORY = 8 << 30  # of a test program that a change has sent astray


class Case(NamedTuple):
    command: tuple  # without the filter
    name: str  # for the filter; nothing for a script
    waits: bool


def targets(room):
    named = [pathlib.Path(each).name for each in TEST_PROGRAMS[room]]
    both = ["velmora", "obdsimProgram"]
    return named + {"libvelmora": both, "program": both, "simulator": both[1:]}.get(room, [])


def hold_back():
    os.nice(5)
    resource.setrlimit(resource.RLIMIT_AS, (MOST_MEMORY, MOST_MEMORY))
    resource.setrlimit(resource.RLIMIT_CORE, (0, 0))


def succeeds(command, limit, environment, folder):
    """Whether the command ends well in time. What it has started goes with it."""
    process = subprocess.Popen(command, cwd=folder, stdin=subprocess.DEVNULL, stdout=subprocess.DEVNULL,
                               stderr=subprocess.DEVNULL, preexec_fn=hold_back, start_new_session=True,
                               env=os.environ | environment)
    try:
        return process.wait(limit) == 0
    except subprocess.TimeoutExpired:
        return False
    finally:
        try:
            os.killpg(process.pid, signal.SIGKILL)
        except ProcessLookupError:
            pass
        process.wait()


class Cases:
    """Those of a room in a build folder of a tree."""

    def __init__(self, room, tree, build, pattern):
        self.tree = tree
        self.cases = []
        for program in TEST_PROGRAMS[room]:
            path = build / "tests" / program
            names = subprocess.run([path, "--gtest_list_tests", f"--gtest_filter={pattern}"], check=True, cwd=tree,
                                   capture_output=True, text=True).stdout
            for line in (line.split("#")[0].rstrip() for line in names.splitlines()[1:]):
                if line.startswith(" "):
                    self.cases.append(Case((str(path),), suite + line.strip(), program in WAITING))
                else:
                    suite = line
        if pattern == "*":
            self.cases += [Case((*command.split(), *(str(build / each) for each in given)), "", True)
                           for command, given in SCRIPTS.get(room, [])]
        self.reached = {}
        self.seconds = {}

    def measure(self, jobs):
        """Runs each case as the tree stands. Returns those that fail, which tell nothing of a change."""
        with concurrent.futures.ThreadPoolExecutor(jobs) as pool:
            good = list(pool.map(self._measure_one, self.cases))
        bad = [case for case, well in zip(self.cases, good) if not well]
        self.cases = [case for case, well in zip(self.cases, good) if well]
        return bad

    def _measure_one(self, case):
        with tempfile.NamedTemporaryFile() as notes:
            notes.write(bytes(NUMBERS))
            notes.flush()
            start = time.monotonic()
            well = self._run([case], 300, {"VELMORA_REACHED": notes.name})
            self.seconds[case] = time.monotonic() - start
            self.reached[case] = {i for i, byte in enumerate(pathlib.Path(notes.name).read_bytes()) if byte}
        return well

    def reaching(self, number):
        return [case for case in self.cases if number in self.reached[case]]

    def notice(self, cases, number, jobs):
        """Whether a case fails with the change of a number; -1 for one that is built in."""
        environment = {"VELMORA_MUTANT": str(number)}
        # What fails once may have failed on a busy machine, not by the change.
        for together in self._batches([case for case in cases if not case.waits]):
            limit = self._limit(together)
            if not self._run(together, limit, environment) and not self._run(together, limit, environment):
                return True
        return self._one_by_one([case for case in cases if case.waits], environment, jobs, number < 0)

    def _batches(self, cases):
        """Cases that run in one process, those first that reach least beside; so few that a change that hangs them is known
        soon."""
        batches, seconds = [], 0
        for case in sorted(cases, key=lambda each: (each.command, len(self.reached[each]))):
            seconds += self.seconds[case]
            if not batches or batches[-1][0].command != case.command or seconds > BATCH:
                batches.append([])
                seconds = self.seconds[case]
            batches[-1].append(case)
        return batches

    def _one_by_one(self, cases, environment, jobs, built_in):
        cases = sorted(cases, key=self.seconds.get)
        for first in range(0, len(cases), jobs):
            some = cases[first:first + jobs]
            with concurrent.futures.ThreadPoolExecutor(jobs) as pool:
                good = list(pool.map(lambda case: self._run([case], self._limit([case]), environment), some))
            for case, well in zip(some, good):
                # A case in real time that fails without the change as well, on a busy machine, has noticed nothing.
                if not well and (built_in or self._run([case], self._limit([case]), {})) and not self._run(
                        [case], self._limit([case]), environment):
                    return True
        return False

    def _limit(self, cases):
        return 10 + 10 * sum(self.seconds[case] for case in cases)

    def _run(self, cases, limit, environment):
        command = list(cases[0].command)
        if cases[0].name:
            command += ["--gtest_brief=1", "--gtest_fail_fast"]
            environment = environment | {"GTEST_FILTER": ":".join(case.name for case in cases)}
        return succeeds(command, limit, environment, self.tree)
