# shellcheck shell=bash disable=SC2034
# Sourced by the other scripts: which Debian packages the work needs, and how they get there.

# To build the program.
build_packages=(g++ cmake ninja-build qt6-base-dev qt6-svg-dev libgl-dev libcli11-dev libcurl4-openssl-dev nlohmann-json3-dev libcsv-dev)
# To show it, with letters, and to trust quote servers.
run_packages=(fonts-dejavu-core ca-certificates)
# To show it on a virtual display and take pictures.
display_packages=(xvfb xauth xdotool x11-utils imagemagick poppler-utils)
# To build and run the tests and the benchmarks.
test_packages=(libgtest-dev libgmock-dev libbenchmark-dev libsqlite3-dev libssl-dev poppler-utils clang-format)
# To make a Debian package.
test_packages+=(dpkg-dev file)
# To check what desktops and man read.
test_packages+=(desktop-file-utils appstream librsvg2-bin libxml2-utils libglib2.0-bin man-db groff-base)
# For scripts/tidy.sh.
tidy_packages=(clang-tidy clang-tools)
# For scripts/coverage.sh.
coverage_packages=(gcovr)
# For scripts/fuzz.sh.
fuzz_packages=(clang)

# fail SENTENCE: ends the script with one clear sentence.
fail() {
    printf '%s: %s\n' "${0##*/}" "$1" >&2
    exit 1
}

# install_missing PACKAGE...: installs the packages that are not there, and says which.
install_missing() {
    local package missing=()
    command -v dpkg-query >/dev/null || fail "this script installs Debian packages, and this is no Debian system"
    for package in "$@"; do
        [ "$(dpkg-query -W -f='${db:Status-Status}' "$package" 2>/dev/null)" = installed ] || missing+=("$package")
    done
    [ ${#missing[@]} -gt 0 ] || return 0
    local as_root=()
    if [ "$(id -u)" -ne 0 ]; then
        command -v sudo >/dev/null ||
            fail "these packages are missing, and only root can install them: ${missing[*]}"
        as_root=(sudo)
    fi
    echo "Installing: ${missing[*]}"
    "${as_root[@]}" apt-get update -q ||
        fail "the package lists could not be fetched (apt-get update); is there a network?"
    "${as_root[@]}" env DEBIAN_FRONTEND=noninteractive \
        apt-get install -q -y --no-install-recommends "${missing[@]}" ||
        fail "these packages could not be installed: ${missing[*]}"
}

# with_progress SENTENCE BUILD_COMMAND...: as quietly, but tells every tenth of the way.
with_progress() {
    local sentence=$1 log status percent last=0
    shift
    log=$(mktemp)
    NINJA_STATUS='%p ' "$@" 2>&1 | tee "$log" | while read -r percent _; do
        if [[ $percent =~ ^([0-9]+)%$ ]] && ((BASH_REMATCH[1] >= last + 10)); then
            last=$((BASH_REMATCH[1] / 10 * 10))
            echo "  $last %"
        fi
    done
    status=${PIPESTATUS[0]}
    [ "$status" -eq 0 ] || tail -n 60 "$log" >&2
    rm -f "$log"
    [ "$status" -eq 0 ] || fail "$sentence"
}

# quietly SENTENCE COMMAND...: runs the command and shows its output only when it fails, with the sentence.
quietly() {
    local sentence=$1 log
    shift
    log=$(mktemp)
    if ! "$@" >"$log" 2>&1; then
        tail -n 60 "$log" >&2
        rm -f "$log"
        fail "$sentence"
    fi
    rm -f "$log"
}
