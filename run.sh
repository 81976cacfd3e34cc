#!/bin/bash
# Builds Quorvan, makes a folder for it and starts it there.
set -eu
here=$(cd "$(dirname "$0")" && pwd)
. "$here/scripts/packages.sh"

usage() {
    cat <<'END'
Usage: ./run.sh [FOLDER] [--sample] [--desktop]

Installs what is missing, builds Quorvan, makes FOLDER (~/Quorvan when none is
given) and starts the program from there. Files in FOLDER that exist are kept;
only the program itself and its help are brought up to date.

  --sample   fill a new folder with two sample portfolios
  --desktop  put the folder's program into your desktop's menu, with its icon

Without a display the program is taken on a short tour on a virtual one, in a
sample folder of the tour's own, and pictures of it are saved.
END
}

folder=
options=()
for argument in "$@"; do
    case $argument in
    --sample | --desktop) options+=("$argument") ;;
    -h | --help) usage && exit 0 ;;
    -*) echo "run.sh: there is no option $argument" >&2 && usage >&2 && exit 2 ;;
    *)
        [ -z "$folder" ] || { usage >&2 && exit 2; }
        folder=$argument
        ;;
    esac
done
if [ -z "$folder" ]; then
    [ -n "${HOME:-}" ] || fail "there is no home folder; name a folder: ./run.sh FOLDER"
    folder=$HOME/Quorvan
fi

existing=$folder
until [ -e "$existing" ]; do
    existing=$(dirname "$existing")
done
[ -d "$existing" ] && [ -w "$existing" ] || fail "the folder $folder cannot be made, or not be written"

packages=("${build_packages[@]}" "${run_packages[@]}")
if [ -z "${DISPLAY:-}${WAYLAND_DISPLAY:-}" ]; then
    packages+=("${display_packages[@]}")
elif [ -z "${DISPLAY:-}" ]; then
    packages+=(qt6-wayland)
fi
install_missing "${packages[@]}"

build=$here/build/run
if [ -e "$build" ]; then
    echo "Building what has changed of Quorvan"
else
    echo "Building Quorvan, which takes some minutes the first time"
fi
# Nothing but the program is built, so the packages of the benchmarks are not needed.
quietly "the build could not be prepared" \
    cmake -S "$here" --preset release -B "$build" -DQUORVAN_BENCH=OFF
targets=(quorvan quorvan-cli)
[ -n "${DISPLAY:-}${WAYLAND_DISPLAY:-}" ] || targets+=(quorvan-tour)
with_progress "the build failed" cmake --build "$build" --parallel "$(nproc)" --target "${targets[@]}"

"$build/tools/quorvan-cli" setup "$folder" "${options[@]}" --program "$build/app/quorvan" --update-program ||
    fail "the folder $folder could not be made ready"

cd "$folder"
if [ -n "${DISPLAY:-}${WAYLAND_DISPLAY:-}" ]; then
    echo "Starting $PWD/quorvan"
    exec ./quorvan
fi
echo "There is no display: $PWD/quorvan starts it where there is one. Taking the tour meanwhile."
exec "$here/scripts/tour.sh" "$build" "$here/build/pictures"
