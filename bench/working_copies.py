# SPDX-License-Identifier: MIT
"""Makes working copies for measurements, and lists of files in them."""

import os
import subprocess
import time

# Keeps the user's own configuration away from git and libgit2.
HERMETIC = {
    "GIT_AUTHOR_NAME": "bench",
    "GIT_AUTHOR_EMAIL": "bench@localhost",
    "GIT_COMMITTER_NAME": "bench",
    "GIT_COMMITTER_EMAIL": "bench@localhost",
    "GIT_CONFIG_NOSYSTEM": "1",
    "LC_ALL": "C.UTF-8",
}


def environment(home):
    """Returns the environment of all programs. HOME and the XDG folders are an empty folder."""
    inherited = {name: os.environ[name] for name in ("PATH", "TMPDIR") if name in os.environ}
    return {**inherited, **HERMETIC, "HOME": home, "XDG_CONFIG_HOME": home, "LD_BIND_NOW": "1"}


def name_of(number):
    """Returns a path of 40 characters. Each folder has 20 files, each folder above has 10 folders."""
    return f"source/module-{number // 200:03d}/section-{number // 20 % 10:02d}/f-{number:05d}.cpp"


def export_stream(count):
    """Returns the input of git fast-import for one commit of `count` small files."""
    yield b"commit refs/heads/main\ncommitter bench <bench@localhost> 1700000000 +0000\n"
    yield b"data 5\nfiles\n"
    for number in range(count):
        content = b"int value%d();\n" % number
        yield b"M 100644 inline %s\ndata %d\n%s\n" % (
            name_of(number).encode(), len(content), content)


def git(root, env, *arguments, **options):
    subprocess.run(["git", "-C", root, *arguments], env=env, check=True, **options)


def make_repository(root, env, *options):
    """Makes an empty repository."""
    subprocess.run(["git", "init", "--quiet", "--initial-branch=main", *options, root], env=env,
                   check=True)
    # libgit2 reads no identity from the environment.
    for name, value in (("user.name", "bench"), ("user.email", "bench@localhost"), ("gc.auto", "0")):
        git(root, env, "config", name, value)


def make_working_copy(root, count, env):
    """Makes a clean working copy. Its files are older than its index, so that a walk trusts the
    index's file times and reads no content."""
    make_repository(root, env)
    git(root, env, "fast-import", "--quiet", input=b"".join(export_stream(count)))
    git(root, env, "read-tree", "HEAD")
    git(root, env, "checkout-index", "--all", "--force")
    past = time.time() - 3600
    for number in range(count):
        os.utime(os.path.join(root, name_of(number)), (past, past))
    git(root, env, "update-index", "--refresh")


def write_list(path, count, of):
    """Lists `count` files of a working copy of `of` files, spread evenly over it."""
    with open(path, "w", encoding="ascii") as file:
        for number in range(count):
            file.write(name_of(number * of // count) + "\n")
