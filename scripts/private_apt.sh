# Sourced by the scripts that need packages which are not for this machine: those of another architecture or of
# another release. apt runs on lists and a cache of its own, so that the machine's stay as they are.

# debian_mirror — where this machine gets Debian from, as far as apt has read its lists.
debian_mirror() {
    local codename
    codename=$(. /etc/os-release && echo "$VERSION_CODENAME")
    apt-get indextargets --format '$(RELEASE) $(REPO_URI)' 'Created-By: Packages' |
        awk -v release="$codename" '$1 == release { print $2; exit }'
}

# private_apt FOLDER ARCHITECTURE SOURCE... — makes FOLDER/apt.conf, for use as APT_CONFIG, and reads the lists of
# the sources ("deb bookworm main", say). Lists may be old, as those of a mirror that is kept as it was are: what
# they name is signed all the same, and used for tests only.
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
    # Signs of trouble are warnings to apt, which goes on with what it has.
    APT_CONFIG=$folder/apt.conf apt-get update -qq -o APT::Update::Error-Mode=any
}
