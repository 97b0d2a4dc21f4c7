#!/bin/sh
# SPDX-License-Identifier: MIT
# checkOnly.sh COMPILER OPTION...: a compiler launcher that only checks the source, and writes an empty object, which
# nothing links.
"$@" -fsyntax-only || exit
while [ "$1" != -o ]; do shift; done
: >"$2"
