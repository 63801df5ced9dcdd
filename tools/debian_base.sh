# For scripts that need a small Debian of their own.
#
#   make_debian_base FOLDER   puts the smallest amd64 Debian of the host's release into FOLDER, from where
#                             the host has its own packages; their signatures are checked against the
#                             host's keys. As root. Mounts end with it.
make_debian_base() {
  local suite mirror
  suite=$(. /etc/os-release && echo "$VERSION_CODENAME")
  mirror=$(apt-get indextargets --format '$(REPO_URI)' "Codename: $suite" "Component: main" | head -n 1)
  unshare --mount --propagation private debootstrap --force-check-gpg \
    --keyring=/usr/share/keyrings/debian-archive-keyring.gpg --arch=amd64 --variant=minbase \
    "$suite" "$1" $mirror
}
