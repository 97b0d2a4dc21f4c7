# SPDX-License-Identifier: MIT
"""Runs the measured programs and reads their output."""

import glob
import os
import statistics
import subprocess

import working_copies

# glibc takes longer to compare two paths near the end of a page, and libgit2 compares each path with
# those in its buffers: one call costs up to 5 % more if such a buffer is there. So the median of COUNTS
# counts is used, each with the program's heap moved by DISPLACEMENT more bytes.
COUNTS = 3
DISPLACEMENT = 528


class Programs:
    """The programs of one build, in one environment. Each run returns the results of its measured
    region, by name."""

    def __init__(self, build, scratch, is_quick=False):
        """:param is_quick: count once and time twice, whatever is asked for"""
        self._build = os.path.join(build, "bench")
        stage = os.path.join(os.path.abspath(build), "stage")
        self.library = glob.glob(os.path.join(stage, "lib", "**", "libvclink_git.so"),
                                 recursive=True)[0]
        self.tool = os.path.join(stage, "bin", "lnxhost", "vkAutoMerge.sh")
        self._scratch = scratch
        self._is_quick = is_quick
        self._env = working_copies.environment(os.path.join(scratch, "home"))

    def run(self, program, *arguments, wrapper=(), env=None):
        command = [*wrapper, os.path.join(self._build, f"vclink_bench_{program}"), *arguments]
        done = subprocess.run(command, env=env or self._env, capture_output=True, text=True)
        if done.returncode != 0:
            raise SystemExit(f"bench: {' '.join(command)} failed:\n{done.stderr}")
        pairs = (line.split() for line in done.stdout.splitlines())
        return {name: int(value) for name, value in pairs}

    def count_in_turn(self, commands, counts=COUNTS, before=lambda: None):
        """Returns the instructions of the region of each command: {name: median}. Calls `before` before
        each run."""
        counted = {name: [] for name in commands}
        for number in range(1 if self._is_quick else counts):
            for name, command in commands.items():
                before()
                counted[name].append(
                    self.instructions(*command, displacement=number * DISPLACEMENT))
        return {name: statistics.median(numbers) for name, numbers in counted.items()}

    def instructions(self, program, *arguments, displacement=0):
        """Returns the instructions that callgrind counts in the region, with the heap moved by some
        bytes."""
        name = "-".join([program, *arguments]).replace("/", "_")
        counts = os.path.join(self._scratch, f"callgrind{name}")
        self.run(program, *arguments, wrapper=[
            "valgrind", "--tool=callgrind", "--instr-atstart=no", f"--callgrind-out-file={counts}"],
            env={**self._env, "VCLINK_BENCH_DISPLACEMENT": str(displacement)})
        with open(counts, encoding="utf-8") as file:
            totals = [line for line in file if line.startswith("totals:")]
        os.remove(counts)
        return int(totals[0].split()[1])

    def allocations(self, program, *arguments):
        """Returns the allocations of the region, which the preloaded library counts."""
        library = os.path.join(self._build, "libvclink_bench_allocations.so")
        return self.run(program, *arguments, env={**self._env, "LD_PRELOAD": library})

    def clock(self, commands, rounds, before=lambda: None, added=None, clock="nanoseconds"):
        """Runs all commands once in each round, in every second round backwards, after one round for
        the system's caches. Calls `before` before each command, and adds `added` to the environment.
        Returns for each round the times in the order of the commands, by this clock:
        "processor_nanoseconds" hardly depends on what else runs."""
        env = {**self._env, **(added or {})}
        times = []
        for number in range((2 if self._is_quick else rounds) + 1):
            order = list(enumerate(commands))
            taken = {}
            for place, command in (reversed(order) if number % 2 else order):
                before()
                taken[place] = self.run(*command, env=env)[clock]
            times.append([taken[place] for place in range(len(commands))])
        return times[1:]


class Ratios:
    """Returns median, smallest and largest ratio of paired times."""

    def __init__(self, rounds, above, below):
        ratios = sorted(times[above] / times[below] for times in rounds)
        self.median = statistics.median(ratios)
        self.smallest = ratios[0]
        self.largest = ratios[-1]

    def __str__(self):
        return f"{self.median:.2f} ({self.smallest:.2f}–{self.largest:.2f})"
