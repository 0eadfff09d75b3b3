#!/usr/bin/env bash
# kt: sets up, builds, runs and checks KTPublic. `./kt help` lists what it does.
#
# Everything it makes lives under build/: compiled programs, the Wine prefix, downloaded sources, stamps of finished
# set-up steps. Only missing Debian packages are installed outside, and only as root or with sudo.
set -euo pipefail

root=$(cd "$(dirname "${BASH_SOURCE[0]}")" && pwd)
stamps=$root/build/setup
jobs=$(nproc)

build_packages=(g++-mingw-w64-x86-64-posix mingw-w64-x86-64-dev binutils-mingw-w64-x86-64 cmake ninja-build
    wine wine64 googletest libboost1.81-dev libcli11-dev libstb-dev xz-utils bzip2)
native_packages=(clang-19 libclang-rt-19-dev g++ libboost-thread1.81-dev libstb-dev)
test_packages=(llvm-19)
bench_packages=(libcereal-dev libspdlog-dev libfmt-dev libutfcpp-dev rapidjson-dev libsimpleini-dev)
lint_packages=(clang-19 clang-format-19 clang-tidy-19)

usage() {
    cat <<'TEXT'
usage: ./kt COMMAND

  demo [--crash] [FOLDER]
                        run the demo host on examples/course/, or on FOLDER; its pictures are in build/demo/index.html;
                        with --crash it faults while it saves, and LLVM's obj2yaml reads its crash dump
  test [CTEST-ARGS]     every test; the arguments go to ctest, for example -L strings
  build                 build/windows/bin/ and build/windows/lib/
  crash-campaign [COUNT]
                        COUNT processes (1000) that crash while they save, and what is left of their work
  run PROGRAM [ARGS]    any Windows program, with the library on its path; its exit status is passed through
  bench [FILTER [ARGS]] the benchmarks beside their peers; the page is build/bench/index.html; the arguments go to
                        Google Benchmark
  sanitize              the portable half natively under ASan and UBSan, then under TSan
  soak [SECONDS]        message threads and timers under load for that long (300), looking for losses, standstill
                        and leaks
  fuzz SECONDS          every fuzz target for that long
  lint                  clang-format and clang-tidy over all sources
  install PREFIX        DLL, headers, CMake package, tools and licence notes

The first call of a command sets up what it needs; later calls start at once.
TEXT
}

fail() {
    printf 'kt: %s\n' "$1" >&2
    exit 1
}

# ---- set-up ----

# as_root COMMAND...: runs it as root; 77 if there is no way to.
as_root() {
    if [ "$(id -u)" = 0 ]; then
        "$@"
    elif command -v sudo >/dev/null && { [ -t 0 ] || sudo -n true 2>/dev/null; }; then
        sudo "$@"
    else
        return 77
    fi
}

apt_install() {
    as_root env DEBIAN_FRONTEND=noninteractive apt-get install -y --no-install-recommends "$@"
}

# need_packages PACKAGE...: installs those that are not there.
need_packages() {
    local package missing=() log=$stamps/apt.log status
    for package in "$@"; do
        [ -e "$stamps/package-$package" ] && continue
        if dpkg-query -W -f '${Status}' "$package" 2>/dev/null | grep -q 'ok installed'; then
            : >"$stamps/package-$package"
        else
            missing+=("$package")
        fi
    done
    [ ${#missing[@]} = 0 ] && return
    command -v apt-get >/dev/null || fail "needs Debian's packages ${missing[*]}, and there is no apt-get here"
    as_root true || fail "please install these packages as root: apt-get install ${missing[*]}"
    echo "kt: installing ${missing[*]}"
    status=0
    apt_install "${missing[@]}" >"$log" 2>&1 || status=$?
    if [ $status != 0 ]; then
        # The package lists may be missing or out of date.
        as_root apt-get update >>"$log" 2>&1 || fail "apt-get update failed: is the network there? (build/setup/apt.log)"
        apt_install "${missing[@]}" >>"$log" 2>&1 || fail "could not install ${missing[*]} (build/setup/apt.log)"
    fi
    for package in "${missing[@]}"; do : >"$stamps/package-$package"; done
}

# private_apt ARGS...: apt-get on package lists of our own, with source packages switched on. The system's stay as they
# are.
private_apt() {
    apt-get -q -o "Dir::Etc::SourceList=$root/build/apt/sources.list" -o Dir::Etc::SourceParts=- \
        -o "Dir::State::Lists=$root/build/apt/lists" -o "Dir::Cache=$root/build/apt/cache" \
        -o APT::Sandbox::User= "$@"
}

# Writes the system's Debian archives as source archives; the file is empty where apt does not know them yet.
list_source_archives() {
    local form='deb-src [signed-by=/usr/share/keyrings/debian-archive-keyring.gpg] $(SITE) $(RELEASE) $(COMPONENT)'
    apt-get indextargets --format "$form" 'Created-By: Packages' 'Origin: Debian' |
        sort -u >"$root/build/apt/sources.list"
}

write_source_list() {
    mkdir -p "$root/build/apt/lists/partial" "$root/build/apt/cache/archives/partial"
    list_source_archives
    [ -s "$root/build/apt/sources.list" ] && return
    as_root apt-get update >"$stamps/apt.log" 2>&1 || fail "apt-get update failed: is the network there? (build/setup/apt.log)"
    list_source_archives
    [ -s "$root/build/apt/sources.list" ] || fail "found no Debian archive among this machine's package sources"
}

# need_source PACKAGE FOLDER...: unpacks these folders of a Debian source package to build/sources/PACKAGE. apt checks
# what it downloads against the signed index.
need_source() {
    local package=$1 log=$stamps/source.log download=$root/build/apt/$1 archive
    shift
    [ "$(cat "$stamps/source-$package" 2>/dev/null)" = "$*" ] && return
    echo "kt: fetching the sources of $package"
    write_source_list
    rm -rf "$download" "$root/build/sources/$package"
    mkdir -p "$download" "$root/build/sources/$package"
    private_apt update >"$log" 2>&1 || fail "could not read the source package lists (build/setup/source.log)"
    (cd "$download" && private_apt source --download-only "$package") >>"$log" 2>&1 ||
        fail "could not fetch the sources of $package: is the network there? (build/setup/source.log)"
    archive=$(find "$download" -name '*.orig.tar.*' ! -name '*.asc' | head -n 1)
    [ -n "$archive" ] || fail "the source package of $package holds no archive (build/setup/source.log)"
    tar -xf "$archive" -C "$root/build/sources/$package" --strip-components=1 --wildcards "${@/#/*/}" ||
        fail "could not unpack the sources of $package"
    rm -rf "$download"
    printf '%s' "$*" >"$stamps/source-$package"
}

# The project's own Wine prefix: no display, Windows 10, nothing of it outside build/. Wine's debugger, which waits for
# ever without a display, is replaced by a program that does not exist: a crash then ends the program at once.
need_wine() {
    [ -e "$stamps/wine" ] && return
    echo "kt: preparing the Wine prefix"
    local log=$stamps/wine.log
    rm -rf "$root/build/wine" "$root/build/home"
    mkdir -p "$root/build/home"
    {
        "$root/cmake/wine-run" wineboot --init &&
            "$root/cmake/wine-run" reg add 'HKCU\Software\Wine\Drivers' /v Graphics /d null /f &&
            "$root/cmake/wine-run" reg add 'HKCU\Software\Wine' /v Version /d win10 /f &&
            "$root/cmake/wine-run" reg add 'HKLM\Software\Microsoft\Windows NT\CurrentVersion\AeDebug' \
                /v Debugger /d none /f
    } >"$log" 2>&1 </dev/null || fail "could not prepare the Wine prefix (build/setup/wine.log)"
    : >"$stamps/wine"
}

need_build_tools() {
    mkdir -p "$stamps"
    need_packages "${build_packages[@]}"
    need_source boost1.81 libs/thread/src libs/serialization/src
    need_wine
}

# configure PRESET [CMAKE-ARGS]: once, and again when asked for other options.
configure() {
    local preset=$1 stamp=$stamps/configured-$1 wanted
    shift
    wanted="$root $*"
    [ -e "$root/build/$preset/build.ninja" ] && [ "$(cat "$stamp" 2>/dev/null)" = "$wanted" ] && return
    (cd "$root" && cmake --preset "$preset" "$@") >"$stamps/configure-$preset.log" 2>&1 || {
        tail -n 20 "$stamps/configure-$preset.log" >&2
        fail "could not configure $preset (build/setup/configure-$preset.log)"
    }
    printf '%s' "$wanted" >"$stamp"
}

compile() {
    local folder=$1
    shift
    local output
    # ninja writes compiler messages to its standard output; they matter only when something failed or warned.
    output=$(ninja -C "$root/build/$folder" --quiet "$@") || {
        printf '%s\n' "$output" >&2
        fail "the build of $folder failed"
    }
}

# ---- commands ----

build() {
    need_build_tools
    configure windows
    compile windows
}

command_demo() {
    local crash=
    if [ "${1:-}" = --crash ]; then
        crash=1
        shift
    fi
    local folder=${1:-$root/examples/course}
    [ $# -le 1 ] || fail "usage: ./kt demo [--crash] [FOLDER]"
    [ -d "$folder" ] || fail "no such folder: $folder"
    folder=$(cd "$folder" && pwd)
    build
    if [ -n "$crash" ]; then
        demo_crash "$folder"
    else
        "$root/cmake/wine-run" "$root/build/windows/bin/ktdemo.exe" "--report=$root/build/demo" "$folder"
    fi
}

# The demo's crash, and what another reader finds in its dump. It ends with status 1, as a fatal error does.
demo_crash() {
    local temp=$root/build/demo-crash status=0
    mkdir -p "$stamps"
    need_packages "${test_packages[@]}"
    "$root/cmake/wine-run" --temp "$temp" "$root/build/windows/bin/ktdemo.exe" --crash "$1" || status=$?
    [ $status = 1 ] || fail "the demo ended with status $status instead of 1"
    echo "  read by obj2yaml   $("$root/tests/crash/check-dumps" --read "$temp")"
}

command_test() {
    mkdir -p "$stamps"
    need_packages "${test_packages[@]}"
    build
    ctest --test-dir "$root/build/windows" --output-on-failure --no-tests=error -j "$jobs" "$@"
}

# In batches, as each process leaves a crash dump, which goes once it has been read.
command_crash_campaign() {
    local count=${1:-1000} first=1 batch folder=$root/build/crash-campaign failed=0
    [[ $count =~ ^[1-9][0-9]*$ ]] || fail "usage: ./kt crash-campaign [COUNT]"
    mkdir -p "$stamps"
    need_packages "${test_packages[@]}"
    build
    rm -rf "$folder"
    while [ "$first" -le "$count" ]; do
        batch=$((count - first + 1 < 50 ? count - first + 1 : 50))
        mkdir -p "$folder"
        echo "kt: processes $first to $((first + batch - 1)) of $count"
        "$root/cmake/wine-run" --temp "$folder/temp" "$root/build/windows/bin/ktcrash.exe" "$batch" "$first" \
            "Z:${folder//\//\\}" || failed=1
        "$root/tests/crash/check-dumps" "$folder/dumps" || failed=1
        rm -rf "$folder/dumps" "$folder/temp"
        first=$((first + batch))
    done
    [ $failed = 0 ] || fail "the campaign found failures; what is left of them is in build/crash-campaign"
    echo "kt: all $count processes left a readable dump, a whole back-up and every document whole"
}

command_run() {
    [ $# -ge 1 ] || fail "usage: ./kt run PROGRAM [ARGS]"
    need_build_tools
    "$root/cmake/wine-run" "$@"
}

command_bench() {
    need_build_tools
    need_packages "${bench_packages[@]}"
    need_source benchmark cmake include src CMakeLists.txt
    configure windows -DKT_BUILD_BENCH=ON
    compile windows ktbench ktlaunch
    # Its own temporary folder, as it writes many log lines there.
    local folder=$root/build/bench temp=$root/build/bench/temp status=0
    mkdir -p "$folder"
    (cd "$folder" && "$root/cmake/wine-run" --temp "$temp" "$root/build/windows/bin/ktbench.exe" --page=index.html \
        ${1:+--benchmark_filter="$1"} "${@:2}") || status=$?
    rm -rf "$temp"
    return $status
}

command_sanitize() {
    mkdir -p "$stamps"
    need_packages cmake ninja-build googletest "${native_packages[@]}"
    local preset
    for preset in native-asan native-tsan; do
        configure "$preset"
        compile "$preset"
        echo "kt: $preset"
        ctest --test-dir "$root/build/$preset" --output-on-failure --no-tests=error -j "$jobs"
    done
}

command_soak() {
    local seconds=${1:-300} temp=$root/build/soak
    [[ $seconds =~ ^[1-9][0-9]*$ ]] || fail "usage: ./kt soak [SECONDS]"
    need_build_tools
    configure windows
    compile windows ktsoak ktlaunch
    "$root/cmake/wine-run" --temp "$temp" "$root/build/windows/bin/ktsoak.exe" "$seconds"
}

# fuzz_target PROGRAM SECONDS: on the committed seeds and what earlier runs found.
fuzz_target() {
    local name=${1##*/fuzz_} corpus log
    corpus=$root/build/fuzz/$name
    log=$root/build/fuzz/$name.log
    mkdir -p "$corpus"
    (cd "$root/build/fuzz" && "$1" -max_total_time="$2" -timeout=10 -rss_limit_mb=2048 -print_final_stats=1 \
        -artifact_prefix="$name-" "$corpus" "$root/fuzz/corpus/$name") >"$log" 2>&1 || {
        tail -n 40 "$log" >&2
        echo "kt: fuzz target $name failed; the input is in build/fuzz/ (build/fuzz/$name.log)" >&2
        : >"$root/build/fuzz/failed"
        return
    }
    echo "kt: $name: $(sed -n 's/^stat::number_of_executed_units: *//p' "$log") inputs in $2 s"
}

# As many targets at a time as there are processors.
command_fuzz() {
    local seconds=${1:-} target
    [[ $seconds =~ ^[1-9][0-9]*$ ]] || fail "usage: ./kt fuzz SECONDS"
    mkdir -p "$stamps"
    need_packages cmake ninja-build "${native_packages[@]}"
    configure native-fuzz
    compile native-fuzz
    rm -f "$root/build/fuzz/failed"
    for target in "$root"/build/native-fuzz/bin/fuzz_*; do
        if [ "$(jobs -rp | wc -l)" -ge "$jobs" ]; then
            wait -n
        fi
        fuzz_target "$target" "$seconds" &
    done
    wait
    [ ! -e "$root/build/fuzz/failed" ] || exit 1
}

command_lint() {
    need_build_tools
    need_packages "${lint_packages[@]}"
    configure windows
    "$root/cmake/lint" "$root"
}

command_install() {
    [ $# = 1 ] || fail "usage: ./kt install PREFIX"
    build
    cmake --install "$root/build/windows" --prefix "$1"
}

main() {
    local command=${1:-help}
    [ $# = 0 ] || shift
    case $command in
    crash-campaign) command_crash_campaign "$@" ;;
    demo | test | run | bench | sanitize | soak | fuzz | lint | install) "command_$command" "$@" ;;
    build) build ;;
    help | -h | --help) usage ;;
    *)
        usage >&2
        exit 2
        ;;
    esac
}

main "$@"
