# SPDX-License-Identifier: MIT
"""Runs programs with a mutant in a sandbox.

A mutated function that ends processes or removes files may end or remove anything. Therefore it can
write only to one folder, its temporary files are in a file system of their own, it sees no other
process and no network, and it has no capability to undo this.
"""

import os
import resource
import subprocess

# Tests that run as root need these: they change the user, and owners of files.
CAPABILITIES = ("SETUID", "SETGID", "CHOWN", "DAC_OVERRIDE", "FOWNER", "FSETID", "KILL")
TEMPORARY_BYTES = 1 << 29
FILE_BYTES = 1 << 29
MEMORY_BYTES = 6 << 30


class TimeLimit(Exception):
    """The command was stopped because it took too long."""


def _limit():
    os.setpriority(os.PRIO_PROCESS, 0, 10)
    resource.setrlimit(resource.RLIMIT_CORE, (0, 0))
    resource.setrlimit(resource.RLIMIT_FSIZE, (FILE_BYTES, FILE_BYTES))
    resource.setrlimit(resource.RLIMIT_AS, (MEMORY_BYTES, MEMORY_BYTES))
    resource.setrlimit(resource.RLIMIT_NPROC, (4096, 4096))


def _prefix(shown, writable):
    options = ["bwrap", "--die-with-parent", "--new-session", "--unshare-pid", "--unshare-ipc"]
    options += ["--unshare-net", "--ro-bind", "/", "/", "--dev", "/dev", "--proc", "/proc"]
    for folder in ("/tmp", "/var/tmp", "/run", "/dev/shm"):
        options += ["--perms", "1777", "--size", str(TEMPORARY_BYTES), "--tmpfs", folder]
    # The folder may be in one of the folders that are hidden now.
    options += ["--ro-bind", shown, shown]
    if writable is not None:
        options += ["--bind", writable, writable]
    if os.geteuid() == 0:
        options += ["--cap-drop", "ALL"]
        for capability in CAPABILITIES:
            options += ["--cap-add", f"CAP_{capability}"]
    return options + ["--setenv", "TMPDIR", "/tmp", "--setenv", "HOME", "/tmp"]


def run(command, shown, folder, seconds, writable=None, variables=None):
    """Returns the command's status and output. Raises TimeLimit after the given seconds."""
    environment = dict(os.environ, CCACHE_DISABLE="1", **(variables or {}))
    with subprocess.Popen(
        _prefix(shown, writable) + ["--chdir", folder, "--"] + command,
        stdin=subprocess.DEVNULL,
        stdout=subprocess.PIPE,
        stderr=subprocess.STDOUT,
        env=environment,
        preexec_fn=_limit,
        text=True,
        errors="replace",
    ) as process:
        try:
            output, _ = process.communicate(timeout=seconds)
        except subprocess.TimeoutExpired as expired:
            # All other processes of the sandbox end with this one.
            process.kill()
            process.communicate()
            raise TimeLimit from expired
        return process.returncode, output
