# Sourced by the other scripts: where the tree is, and its own quiet Wine prefix.
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
export WINEPREFIX=${ORVIX_WINEPREFIX:-$root/build/wine-prefix}
export WINEARCH=win64 WINEDEBUG=-all WINEDLLOVERRIDES="mscoree=;mshtml=;winemenubuilder.exe=;winedbg.exe="
export LC_ALL=C.UTF-8 # in another locale Wine has no files with non-ASCII names
wineserver=/usr/lib/wine/wineserver
wine=(/usr/lib/wine/wine64)
# Wine's loader is below 2 GiB, and Linux puts its heap at random within 1 GiB after it: one start in some 5,000
# finds the heap where Windows has the data that all processes share (0x7ffe0000) and ends there. Without that
# randomness none does.
if setarch -R true 2>/dev/null; then wine=(setarch -R "${wine[@]}"); fi

# What `at_exit COMMAND...` is given runs when the script ends, the last one first.
at_exit() {
    exit_commands="${*@Q};${exit_commands:-}"
    trap "$exit_commands" EXIT
}

# One X server without a screen serves the rest of the calling script, which shows its windows there and never on the
# user's own display. Call it before use_one_wineserver: a wineserver keeps the display that it began with. Without such
# an X server there is no display, and the tests and measures that need one are skipped.
use_virtual_display() {
    unset DISPLAY
    local number
    exec {number}< <(exec Xvfb -displayfd 1 -screen 0 1280x1024x24 -nolisten tcp 2>/dev/null)
    local xvfb=$!
    if read -r -t 30 -u "$number" DISPLAY; then
        export DISPLAY=:$DISPLAY
        at_exit kill "$xvfb"
    else
        unset DISPLAY
        echo "no display (Xvfb does not start): what shows dialogs is skipped"
    fi
}

# A drive of 128 KB for the tests that fill one, until the script ends. Where the user may not mount one, they are
# skipped.
use_small_drive() {
    local folder=$WINEPREFIX.small-drive
    mkdir -p "$folder"
    if mount -t tmpfs -o size=128k tmpfs "$folder" 2>/dev/null; then
        at_exit umount "$folder"
        export ORVIX_SMALL_DRIVE=Z:${folder//\//\\}
    else
        echo "no small drive (mount is not allowed): the tests that fill one are skipped"
    fi
}

# One wineserver serves the rest of the calling script: it starts here, with no pipe of the script open, and
# is stopped when the script ends. One that was running already stays; ORVIX_KEEP_WINESERVER=1 keeps this one too.
use_one_wineserver() {
    if ! "$wineserver" -k0; then
        "$wineserver" -p </dev/null >/dev/null 2>&1
        [ "${ORVIX_KEEP_WINESERVER:-0}" = 1 ] || at_exit "$wineserver" -k
    fi
    # An idle program keeps the services up, which the first program starts and the last one stops: 1.5 s each time.
    # It ends with the script, which holds the other end of its input.
    exec {idle}> >(exec "$root/scripts/wine" cmd >/dev/null 2>&1)
}
