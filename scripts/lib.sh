# Sourced by the other scripts: where the tree is, and its own quiet Wine prefix.
root=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)
export WINEPREFIX=${ORVIX_WINEPREFIX:-$root/build/wine-prefix}
export WINEARCH=win64 WINEDEBUG=-all WINEDLLOVERRIDES="mscoree=;mshtml=;winemenubuilder.exe="
export LC_ALL=C.UTF-8 # in another locale Wine has no files with foreign letters in their names
wineserver=/usr/lib/wine/wineserver

# One wineserver serves the rest of the calling script: it starts here, with no pipe of the script in its hands, and
# is stopped when the script ends. One that was running already stays; ORVIX_KEEP_WINESERVER=1 keeps this one too.
use_one_wineserver() {
    if ! "$wineserver" -k0; then
        "$wineserver" -p </dev/null >/dev/null 2>&1
        [ "${ORVIX_KEEP_WINESERVER:-0}" = 1 ] || trap '"$wineserver" -k' EXIT
    fi
    # An idle program keeps the services up, which the first program starts and the last one stops: 1.5 s each time.
    # It ends with the script, which holds the other end of its input.
    exec {idle}> >(exec "$root/scripts/wine" cmd >/dev/null 2>&1)
}
