#!/usr/bin/env bash
# Fetches and unpacks a Debian source package, with Debian's patches applied:
#   debian-source.sh WORK PACKAGE[=VERSION]
# The machine's own package sources are turned into source entries in a private apt
# configuration under WORK (the machine's apt configuration is left as it is, and needs no
# deb-src lines); the package is unpacked in WORK. Prints the unpacked folder.
set -euo pipefail

if [ $# -ne 2 ]; then
    echo "usage: debian-source.sh WORK PACKAGE[=VERSION]" >&2
    exit 2
fi
mkdir -p "$1"
work=$(cd "$1" && pwd)
package=$2
name=${package%%=*}

apt=$work/apt
mkdir -p "$apt/lists/partial" "$apt/sources.list.d" "$apt/cache/archives/partial"
found_source=0
for file in /etc/apt/sources.list.d/*.sources; do
    [ -f "$file" ] || continue
    sed -E 's/^Types:.*/Types: deb-src/' "$file" >"$apt/sources.list.d/$(basename "$file")"
    found_source=1
done
for file in /etc/apt/sources.list /etc/apt/sources.list.d/*.list; do
    [ -f "$file" ] || continue
    sed -nE 's/^[[:space:]]*deb[[:space:]]/deb-src /p' "$file" \
        >"$apt/sources.list.d/$(basename "$file" .list)-src.list"
    found_source=1
done
if [ "$found_source" -eq 0 ]; then
    echo "debian-source: no apt package sources are configured" >&2
    exit 1
fi
apt_options=(
    -o "Dir::Etc::SourceList=/dev/null" -o "Dir::Etc::SourceParts=$apt/sources.list.d"
    -o "Dir::State::Lists=$apt/lists" -o "Dir::Cache=$apt/cache"
    -o "APT::Sandbox::User=root" -q
)
log=$work/apt-$name.log
echo "debian-source: fetching the source package $package" >&2
apt-get "${apt_options[@]}" update >"$log" 2>&1 || { cat "$log" >&2; exit 1; }
(cd "$work" && apt-get "${apt_options[@]}" source "$package" >>"$log" 2>&1) ||
    { cat "$log" >&2; exit 1; }
source=$(find "$work" -mindepth 1 -maxdepth 1 -type d -name "$name-*" | head -n 1)
if [ -z "$source" ]; then
    echo "debian-source: $package was fetched but no $name-* folder was unpacked in $work" >&2
    exit 1
fi
echo "$source"
