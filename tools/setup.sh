# tools/setup.sh: what ./run and ./check share: packages, build, interpreter. To be sourced.

project=$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)

fail() {
    printf '%s\n' "$@" >&2
    exit 1
}

# missing_packages [full]: the packages of packages.txt that are not installed, one a line.
missing_packages() {
    local name only_full='/^# full:/,$d'
    [[ ${1-} != full ]] || only_full=
    sed "$only_full; s/#.*//" "$project/packages.txt" | xargs -n1 | while read -r name; do
        [[ $(dpkg-query -W -f='${db:Status-Status}' "$name" 2>/dev/null) == installed ]] ||
            printf '%s\n' "$name"
    done
}

# install_packages [full]: installs what is missing. Needs neither network nor root where nothing is.
install_packages() {
    command -v dpkg-query >/dev/null ||
        fail "This needs Debian's dpkg. Install what packages.txt lists, then use CMakePresets.json."
    local missing as_root=()
    mapfile -t missing < <(missing_packages "$@")
    ((${#missing[@]})) || return 0
    if ((EUID)); then
        command -v sudo >/dev/null ||
            fail "These Debian packages are missing, and installing them needs root or sudo:" \
                "  ${missing[*]}"
        as_root=(sudo)
    fi
    echo "Installing ${missing[*]}" >&2
    quietly packages "${as_root[@]}" apt-get update
    quietly packages "${as_root[@]}" env DEBIAN_FRONTEND=noninteractive \
        apt-get install --yes --no-install-recommends "${missing[@]}"
}

# quietly NAME COMMAND...: runs a command with its output in build/NAME.log; shows that and ends when
# the command fails.
quietly() {
    local log=$project/build/$1.log
    shift
    mkdir -p "$project/build"
    if ! "$@" >"$log" 2>&1; then
        cat "$log" >&2
        fail "Failed: $*"
    fi
}

# build_preset PRESET: configures and builds; one at a time in a build tree.
build_preset() {
    mkdir -p "$project/build"
    (
        flock 9
        cd "$project"
        quietly "$1" cmake --preset "$1"
        quietly "$1" cmake --build --preset "$1"
    ) 9>"$project/build/$1.lock"
}

# python PRESET ARGUMENT...: Python with the package that the preset built.
python() {
    local tree=$project/build/$1/python
    shift
    PYTHONPATH=$tree "$(<"$tree/interpreter")" "$@"
}
