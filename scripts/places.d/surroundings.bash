# shellcheck shell=bash
# SPDX-License-Identifier: MIT
# What scripts/places finds out about programs and file systems.

# system_of PROGRAM: the system, and the releases of libgit2 and git that are compared.
system_of()
{
    local library
    library=$(ldd "$1" 2>/dev/null | awk '$1 ~ /^libgit2\.so/ { print $3 }')
    if [[ -n $library ]]; then library=$(realpath "$library"); fi
    printf '%s, libgit2 %s, git %s\n' \
        "$(sed -n 's/^PRETTY_NAME="\(.*\)"/\1/p' /etc/os-release)" \
        "${library#*libgit2.so.}" "$(git --version | sed 's/^git version //')"
}

# missing_in FOLDER: prints what the tests of obstacles need, but cannot make in the folder.
missing_in()
{
    local folder=$1/probe missing=()
    if ! { mkdir "$folder" && echo text >"$folder/file"; } 2>/dev/null; then
        rm -rf "$folder" 2>/dev/null || true
        echo 'nothing can be written'
        return
    fi
    ln -s file "$folder/link" 2>/dev/null && [[ -L $folder/link ]] || missing+=(links)
    mkfifo "$folder/pipe" 2>/dev/null && [[ -p $folder/pipe ]] || missing+=(pipes)
    python3 -c 'import socket, sys; socket.socket(socket.AF_UNIX).bind(sys.argv[1])' "$folder/socket" \
        2>/dev/null || missing+=(sockets)
    if [[ -x $folder/file ]] || ! chmod +x "$folder/file" 2>/dev/null || [[ ! -x $folder/file ]]; then
        missing+=('executable files')
    fi
    rm -rf "$folder"
    if ((${#missing[@]} > 0)); then
        printf 'no %s' "${missing[0]}"
        if ((${#missing[@]} > 1)); then printf ', %s' "${missing[@]:1}"; fi
        echo
    fi
}

# surroundings_result LOG: passed cases, compared situations, and how many of these git ends in another way. All
# of them are listed with reasons if the cases have passed. Fails if the program did not come to its end.
surroundings_result()
{
    local cases
    cases=$(program_result "$1") || return
    awk -v cases="$cases" '
        /^[0-9]+ situations of / { situations += $1 }
        /^ +[0-9]+ x git / {
            line = $0
            sub(/^ +[0-9]+ x git /, "", line)
            split(line, ends, ", the library ")
            if (ends[1] != ends[2]) others += $1
        }
        END {
            if (situations > 0) cases = cases ", " situations " situations, git differs in " others + 0
            print cases
        }' "$1"
}
