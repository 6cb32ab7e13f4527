# What ./quickstart and ./test share; they source it. A script that fails says as its last line at which step.

step="installing packages"
trap '[[ $? -eq 0 ]] || echo "FAILED: $step" >&2' EXIT

begin()
{
    step=$1
    echo "== $step"
}

# Installs those of the named Debian packages that are missing, and says which before it does, and how to be asked
# first. Says nothing if there are none. With NO_INSTALL set it only says which, and fails.
install_packages()
{
    local package missing=() as_root=()
    for package in "$@"; do
        dpkg-query --show --showformat '${db:Status-Status}\n' "$package" 2>/dev/null | grep -qx installed ||
            missing+=("$package")
    done
    [[ ${#missing[@]} -gt 0 ]] || return 0

    echo "This machine lacks the Debian packages ${missing[*]}"
    if [[ -n ${NO_INSTALL:-} ]]; then
        echo "They are not installed, since NO_INSTALL is set. To do it: apt-get install ${missing[*]}" >&2
        return 1
    fi
    if ! command -v apt-get >/dev/null; then
        echo "There is no apt-get here. Needed are what Debian calls ${missing[*]}" >&2
        return 1
    fi
    if [[ $EUID -ne 0 ]]; then
        if ! command -v sudo >/dev/null; then
            echo "You are not root, and there is no sudo. As root: apt-get install ${missing[*]}" >&2
            return 1
        fi
        as_root=(sudo)
    fi

    begin "installing them with apt-get; NO_INSTALL=1 in the environment keeps ./test and ./quickstart from it"
    "${as_root[@]}" apt-get update -qq
    "${as_root[@]}" env DEBIAN_FRONTEND=noninteractive \
        apt-get install -qq --no-install-recommends -o DPkg::Lock::Timeout=300 "${missing[@]}" >/dev/null
}
