# Shared set-up of the run-*.sh scripts; sourced, not run.
# Installs whatever scripts/packages.txt lists that is missing (apt-get, once).

ZR_ROOT="$(cd "$(dirname "${BASH_SOURCE[0]}")/.." && pwd)"
ZR_JOBS="${ZR_JOBS:-2}"

zr_install_packages() {
    local wanted missing=()
    mapfile -t wanted < <(grep -v '^[[:space:]]*\(#\|$\)' "$ZR_ROOT/scripts/packages.txt")
    for pkg in "${wanted[@]}"; do
        # dpkg -s also knows packages removed with their configuration kept: ask
        # for the installed state, not just for an entry.
        if ! dpkg -s "$pkg" 2>/dev/null | grep -q '^Status: install ok installed'; then
            missing+=("$pkg")
        fi
    done
    if [ ${#missing[@]} -eq 0 ]; then
        echo "== packages: all present"
        return
    fi
    local sudo=()
    if [ "$(id -u)" -ne 0 ]; then
        if command -v sudo >/dev/null; then
            sudo=(sudo)
        else
            echo "error: missing packages (${missing[*]}) and neither root nor sudo" >&2
            exit 1
        fi
    fi
    echo "== packages: installing ${missing[*]}"
    "${sudo[@]}" apt-get update
    DEBIAN_FRONTEND=noninteractive "${sudo[@]}" apt-get install -y --no-install-recommends "${missing[@]}"
}

# zr_build DIR [cmake options...]: configures DIR (under the repository) and builds it.
zr_build() {
    local dir="$1"
    shift
    echo "== configure $dir $*"
    cmake -S "$ZR_ROOT" -B "$dir" "$@"
    echo "== build $dir"
    cmake --build "$dir" -j "$ZR_JOBS"
}

# zr_check_format: fails naming every tracked C++ file that .clang-format would lay
# out differently.
zr_check_format() {
    echo "== format ($(clang-format --version))"
    local files
    mapfile -t files < <(git -C "$ZR_ROOT" ls-files '*.cpp' '*.h')
    (cd "$ZR_ROOT" && clang-format --dry-run -Werror "${files[@]}")
}
