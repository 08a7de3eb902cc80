#!/bin/sh
# Installs what the build needs, builds Orvane, starts it, and shows feeds and their newest entries.
#
# ./run.sh                    subscribes to two sample feeds, which are served on this machine
# ./run.sh URL...             subscribes to the feeds of these URLs instead
# ./run.sh shell              leaves you in a shell in which "orvane" works
# ./run.sh inspect FILE...    shows what documents of yours are read as
# ./run.sh bench              measures the library
#
# With --home DIR in front of all that, everything is kept below DIR instead of in your own folders.
# Nothing else is touched but the folder "build".
set -eu
# Files are named from where the user stands.
called=$PWD
cd "$(dirname "$0")"
top=$PWD
port=48791

if [ "${1:-}" = --home ]; then
    [ $# -ge 2 ] || { echo "run.sh: --home needs DIR behind it" >&2; exit 2; }
    mkdir -p "$2"
    home=$(cd "$2" && pwd)
    shift 2
    export HOME="$home" XDG_DATA_HOME="$home/data" XDG_CONFIG_HOME="$home/config"
    export XDG_CACHE_HOME="$home/cache" XDG_RUNTIME_DIR="$home/run"
    # What is kept apart has a bus of its own, too.
    unset DBUS_SESSION_BUS_ADDRESS
    mkdir -p "$XDG_DATA_HOME" "$XDG_CONFIG_HOME" "$XDG_CACHE_HOME" "$XDG_RUNTIME_DIR"
    chmod 700 "$XDG_RUNTIME_DIR"
fi

what=${1:-samples}
case $what in
bench) Tools/install_packages build run bench >&2 ;;
*) Tools/install_packages build run >&2 ;;
esac

build() {
    cmake --preset release -DBUILD_TESTING=OFF "-DORVANE_BENCHMARKS=$1"
    cmake --build --preset release
}

built=$top/build/release
export ORVANE_PROGRAMS="$built/libexec/orvane"
export ORVANE_RESOURCES="$built/share/orvane"
export XDG_DATA_DIRS="$built/share:${XDG_DATA_DIRS:-/usr/local/share:/usr/share}"
export PATH="$built/bin:$PATH"

if [ "$what" = bench ]; then
    build ON
    for program in build/release/Benchmarks/*_benchmark; do
        echo
        echo "== $(basename "$program")"
        "$program"
    done
    exit
fi

# What is built is of no interest to who wants to use it, unless it fails.
mkdir -p "$top/build"
echo "Building; the first time takes some minutes." >&2
if ! build OFF >"$top/build/run.log" 2>&1; then
    cat "$top/build/run.log" >&2
    exit 1
fi

is_running() {
    orvane status --json 2>/dev/null | grep -q '"agent": "running"'
}

# A message bus that was there before does not know how to start what was built here. A second agent
# ends at once; the first ends when it has nothing to do.
start_agent() {
    is_running && return
    setsid "$built/libexec/orvane/orvane-agent" </dev/null >/dev/null 2>&1 &
    tries=100
    until is_running; do
        tries=$((tries - 1))
        [ $tries -gt 0 ] || { orvane doctor || exit $?; }
        sleep 0.1
    done
}

serve_samples() {
    python3 -m http.server $port --bind 127.0.0.1 --directory "$top/Resources/samples" \
        </dev/null >/dev/null 2>&1 &
    server=$!
    trap 'kill $server 2>/dev/null || true' EXIT
    tries=100
    until python3 -c "import socket; socket.create_connection(('127.0.0.1', $port))" 2>/dev/null; do
        tries=$((tries - 1))
        [ $tries -gt 0 ] || { echo "run.sh: nothing can be served on port $port" >&2; exit 1; }
        sleep 0.1
    done
}

cd "$called"
case $what in
inspect)
    exec orvane "$@"
    ;;
shell)
    start_agent
    echo "\"orvane\" is on the path; \"orvane -h\" tells what it can do; \"exit\" leaves." >&2
    exec "${SHELL:-/bin/sh}"
    ;;
-*)
    echo "run.sh: there is no option $what" >&2
    exit 2
    ;;
samples)
    start_agent
    serve_samples
    set -- "http://127.0.0.1:$port/news.xml" "http://127.0.0.1:$port/broken.rss"
    ;;
*)
    start_agent
    ;;
esac

orvane add "$@" >/dev/null || status=$?
orvane refresh >/dev/null || status=$?
echo
orvane feeds
echo
orvane entries -n 20
exit ${status:-0}
