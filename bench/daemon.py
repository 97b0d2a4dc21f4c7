# SPDX-License-Identifier: MIT
"""git's own server, for measurements over git://."""

import os
import socket
import subprocess
import time

ATTEMPTS = 5
PATIENCE = 30


def free_port():
    with socket.socket() as probe:
        probe.bind(("127.0.0.1", 0))
        return probe.getsockname()[1]


class Daemon:
    """Serves the repositories below a folder, at `url`/NAME, while it is entered."""

    def __init__(self, folder, env):
        self._folder = folder
        self._env = env

    def __enter__(self):
        # Starts the server itself: "git daemon" would only be its parent.
        program = os.path.join(subprocess.check_output(["git", "--exec-path"], text=True).strip(),
                               "git-daemon")
        for _ in range(ATTEMPTS):
            port = free_port()
            self._process = subprocess.Popen(
                [program, "--listen=127.0.0.1", f"--port={port}", "--export-all",
                 "--enable=receive-pack", f"--base-path={self._folder}", self._folder],
                env=self._env, stdin=subprocess.DEVNULL, stderr=subprocess.DEVNULL)
            if self._answers(port):
                self.url = f"git://127.0.0.1:{port}"
                return self
            self.__exit__()
        raise SystemExit("bench: git daemon does not start")

    def _answers(self, port):
        """Returns false if the server has ended, because another program has taken the port."""
        end = time.monotonic() + PATIENCE
        while time.monotonic() < end and self._process.poll() is None:
            try:
                socket.create_connection(("127.0.0.1", port), 1).close()
                return self._process.poll() is None
            except OSError:
                time.sleep(0.05)
        return False

    def __exit__(self, *_):
        self._process.terminate()
        self._process.wait()
