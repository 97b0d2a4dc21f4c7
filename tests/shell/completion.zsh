#!/usr/bin/env zsh
# SPDX-License-Identifier: MIT
# completion.zsh SHELL COMPLETION: a zsh at a terminal offers every command and option that
# the help of vclink-shell lists. What it offers is read from the completion's own last step.
emulate -R zsh
setopt err_exit no_unset pipe_fail
zmodload zsh/zpty zsh/zselect

program=${1:A}
folder=$(mktemp -d)
trap 'zpty -d shell 2>/dev/null; rm -rf -- "$folder"' EXIT
export HOME=$folder ZDOTDIR=$folder GIT_CONFIG_NOSYSTEM=1 TERM=dumb
mkdir $folder/bin $folder/functions
ln -s $program $folder/bin/vclink-shell
cp ${2:A} $folder/functions/_vclink-shell
path=($folder/bin $path)
git init --quiet --initial-branch=main $folder/birds
git -C $folder/birds -c user.name=A -c user.email=a@example.org commit --quiet --allow-empty -m B
git -C $folder/birds branch 'sea$(id)'
mkdir $folder/harbour

cat >$folder/.zshrc <<'END'
fpath=($HOME/functions $fpath)
autoload -Uz compinit && compinit -u -d $HOME/dump
setopt no_list_beep
compadd()
{
    local -a offered
    if [[ " ${@[1,(i)(-|--)]} " == *' '-[[:alpha:]]#[OAD]' '* ]]; then
        builtin compadd "$@"
        return
    fi
    builtin compadd -A offered "$@"
    print -rl -- $offered >>$HOME/offered
    builtin compadd "$@"
}
tell() { zle -I; zle .kill-whole-line; print -r -- done >$HOME/told; }
zle -N tell
bindkey '^I' complete-word '^T' tell
print -r -- ready >$HOME/told
END

wait_until_told()
{
    local -i left=3000
    until [[ -s $folder/told ]]; do
        ((left-- > 0)) || { print -ru2 'the shell does not answer'; exit 1 }
        # What it draws is read, or it would wait for that.
        zpty -rt shell drawn || true
        zselect -t 2 || true
    done
    rm $folder/told
}

# offers WORDS: the words that the tab key offers after these, in reply.
offers()
{
    rm -f $folder/offered
    zpty -nw shell "$1"$'\t\x14'
    wait_until_told
    reply=()
    [[ ! -e $folder/offered ]] || reply=("${(@f)$(<$folder/offered)}")
}

entries()
{
    $program ${@[2,-1]} --help | sed -n "/^$1:\$/,/^\$/p" | grep -oE '^  [^ ]+' | tr -d ' ' | tr , '\n'
}

integer failures=0
expect()
{
    offers $1
    [[ -n ${reply[(re)$2]-} ]] && return
    print -ru2 "after '$1' $2 is not offered, but: $reply"
    failures+=1
}

cd $folder
zpty shell zsh -i
wait_until_told
names=(${(f)"$(entries Commands)"})
(($#names > 10)) || { print -ru2 "the help tells of $#names commands"; exit 1 }
for command in $names; do
    expect "vclink-shell ${command[1]}" $command
    for option in ${(f)"$(entries Options $command)"}; do
        expect "vclink-shell $command -" $option
    done
done
for option in ${(f)"$(entries Options)"}; do
    expect 'vclink-shell -' $option
done
expect 'vclink-shell --progress a' auto
expect 'vclink-shell --log parameter,stack' stack-trace
expect 'vclink-shell -C har' harbour
expect 'vclink-shell -C harbour sta' status
# Quoted as the command line needs it.
expect 'vclink-shell -C birds switch s' 'sea\$\(id\)'
git -C birds remote add nest $folder/nest
touch 'birds/a new one' birds/tracked
git -C birds add tracked
expect 'vclink-shell -C birds fetch n' nest
expect 'vclink-shell -C birds push nest m' main
expect 'vclink-shell -C birds add a' 'a\ new\ one'
expect 'vclink-shell -C birds revert t' tracked
expect 'vclink-shell help stat' state
expect 'vclink-shell rm har' harbour
exit $((failures > 0))
