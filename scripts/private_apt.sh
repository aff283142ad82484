# shellcheck shell=bash
# Provides a private apt configuration for packages of another architecture or release. It has its own lists and
# cache, so those of the machine are unchanged. Sourced by other scripts.

# debian_mirror — prints the URI of this machine's Debian mirror; prints nothing if apt has no lists.
debian_mirror() {
    local codename
    codename=$(. /etc/os-release && echo "$VERSION_CODENAME")
    apt-get indextargets --format '$(RELEASE) $(REPO_URI)' 'Created-By: Packages' |
        awk -v release="$codename" '$1 == release { print $2; exit }'
}

# private_apt FOLDER ARCHITECTURE SOURCE... — writes FOLDER/apt.conf, for use as APT_CONFIG, and reads the lists of
# the sources, such as "deb bookworm main". Expired lists are accepted, for mirrors with a fixed state: the packages
# are still signed, and are used for tests only.
private_apt() {
    local folder=$1 architecture=$2 mirror source
    shift 2
    mirror=$(debian_mirror)
    [ -n "$mirror" ] || { apt-get update -qq >&2 || true; mirror=$(debian_mirror); }
    [ -n "$mirror" ] || { echo "apt knows no source of Debian packages" >&2; return 1; }
    mkdir -p "$folder"/lists/partial "$folder"/cache/archives/partial
    cat >"$folder/apt.conf" <<CONF
Dir::State::lists "$folder/lists";
Dir::State::status "/dev/null";
Dir::Cache "$folder/cache";
Dir::Etc::sourcelist "$folder/sources.list";
Dir::Etc::sourceparts "-";
APT::Architecture "$architecture";
APT::Architectures { "$architecture"; };
APT::Sandbox::User "root";
Acquire::Languages "none";
Acquire::Check-Valid-Until "false";
CONF
    for source in "$@"; do
        echo "${source%% *} [signed-by=/usr/share/keyrings/debian-archive-keyring.gpg] $mirror ${source#* }"
    done >"$folder/sources.list"
    # By default apt reports failed downloads as warnings and continues with old lists.
    APT_CONFIG=$folder/apt.conf apt-get update -qq -o APT::Update::Error-Mode=any
}
