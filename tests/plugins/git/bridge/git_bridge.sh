#!/bin/bash
# The Unix half of the bridge: runs the machine's Git as the Windows half says in the folder of the call.
call=$ORVIX_GIT_CALL
unset ORVIX_GIT_CALL
mapfile -d '' -t arguments <"$call/arguments"
mkfifo "$call/alive"
setsid git "${arguments[@]}" <"$call/input" >"$call/output" 2>"$call/errors" &
git=$!
# The Windows half writes a line when it is asked to end. When it has ended, for whatever reason, this file comes to its
# end.
{
    read -r _ && kill -TERM -- "-$git"
    cat >/dev/null
    kill -KILL -- "-$git"
    rm -rf "$call"
} <"$call/alive" 2>/dev/null &
watcher=$!
wait "$git" 2>/dev/null
code=$?
kill "$watcher" 2>/dev/null && wait "$watcher" 2>/dev/null
[ -d "$call" ] || exit
echo "$code" >"$call/code"
# The Windows half deletes that file when it has read everything. It does not wait for the rest.
for _ in {1..500}; do
    [ -e "$call/code" ] || break
    sleep 0.02
done
rm -rf "$call"
