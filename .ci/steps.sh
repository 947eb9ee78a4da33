# Steps that `run` and `test` share; sourced by both. The caller has set `root` (this tree) and `program` (its own name).

# Everything a person reads while waiting goes to standard error; results alone go to standard output.
say() {
    printf '%s\n' "$*" >&2
}

fail() {
    printf '%s: %s\n' "$program" "$*" >&2
    exit 1
}

# packagesOf FILE PART...: the packages that these parts of packages/FILE list.
packagesOf() {
    local file=$1 wanted=" ${*:2} " part='' line
    while IFS= read -r line || [ -n "$line" ]; do
        case $line in
        '# == '*' ==') part=${line#\# == } part=${part% ==} ;;
        '#'* | '') ;;
        *) if [[ $wanted == *" $part "* ]]; then printf '%s\n' "$line"; fi ;;
        esac
    done <"$root/packages/$file"
}

# absentOf PACKAGE...: those of them that are not installed.
absentOf() {
    local package
    for package in "$@"; do
        if [ "$(dpkg-query -W -f='${db:Status-Status}' "$package" 2>/dev/null)" != installed ]; then
            printf '%s\n' "$package"
        fi
    done
}

# installPackages PACKAGE...: installs what is absent and touches nothing else.
installPackages() {
    local absent asRoot=() log="$root/build/packages.log"
    if ! command -v dpkg-query >/dev/null; then
        say "$program: this is no Debian system, so packages/build and packages/run are taken as installed"
        return
    fi
    mapfile -t absent < <(absentOf "$@" | sort -u)
    if [ ${#absent[@]} -eq 0 ]; then
        return
    fi
    if [ "$(id -u)" -ne 0 ]; then
        command -v sudo >/dev/null || fail "as an administrator, type: apt-get install --no-install-recommends ${absent[*]}"
        asRoot=(sudo)
        # Nobody can type a password where there is no terminal.
        if [ ! -t 0 ]; then asRoot=(sudo -n); fi
    fi
    say "installing ${#absent[@]} absent packages: ${absent[*]}"
    mkdir -p "$root/build"
    # An index that cannot be renewed may still be good enough.
    "${asRoot[@]}" env DEBIAN_FRONTEND=noninteractive apt-get -qq update >"$log" 2>&1 ||
        say "$program: the package index could not be renewed, see $log"
    if ! "${asRoot[@]}" env DEBIAN_FRONTEND=noninteractive apt-get -qq -y -o Dpkg::Use-Pty=0 -o DPkg::Lock::Timeout=120 \
        install --no-install-recommends "${absent[@]}" </dev/null >>"$log" 2>&1; then
        tail -n 5 "$log" >&2
        fail "installing ${absent[*]} failed, see $log"
    fi
}

# Both scripts configure alike, so that neither makes the other build everything anew.
configure() {
    local preset=$1 launcher='' log="$root/build/$1/configure.log"
    if command -v ccache >/dev/null; then
        launcher=ccache
        if [ -z "${CCACHE_DIR:-}" ] && [ ! -w "${HOME:-/nonexistent}" ]; then
            export CCACHE_DIR="$root/build/ccache"
        fi
    fi
    mkdir -p "$root/build/$preset"
    if ! (cd "$root" && cmake --preset "$preset" -DCMAKE_CXX_COMPILER_LAUNCHER="$launcher") </dev/null >"$log" 2>&1; then
        tail -n 30 "$log" >&2
        say "$program: configuring $preset failed, see $log"
        return 1
    fi
}

# build PRESET [TARGET...]: on a terminal one line that counts, else silent; what the compiler says is shown on failure.
build() {
    local preset=$1 jobs log="$root/build/$1/build.log" targets=()
    if [ $# -gt 1 ]; then targets=(--target "${@:2}"); fi
    jobs=$(nproc)
    configure "$preset" || return 1
    if [ -t 2 ]; then
        NINJA_STATUS="building $preset [%f/%t] " cmake --build "$root/build/$preset" -j "$jobs" "${targets[@]}" </dev/null >&2 &&
            return
    else
        cmake --build "$root/build/$preset" -j "$jobs" "${targets[@]}" </dev/null >"$log" 2>&1 && return
        grep -v '^\[[0-9]*/[0-9]*\] [A-Z]' "$log" | tail -n 60 >&2
    fi
    say "$program: building $preset failed"
    return 1
}
