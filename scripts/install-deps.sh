#!/usr/bin/env bash
# Installs the Debian 12 packages that building, running and testing zubase need.
# Does nothing when all of them are present already.
set -euo pipefail

packages=(
    build-essential cmake ninja-build pkg-config
    qtbase5-dev qtbase5-private-dev qt5-style-plugins libqt5x11extras5-dev libx11-dev
    libpam0g-dev libpam-modules libpam-runtime libcap-dev zlib1g-dev
    xvfb xauth libxtst6 socat python3 passwd fonts-dejavu-core
    e2fsprogs mount openssl curl
)

missing=()
for package in "${packages[@]}"; do
    dpkg-query -W -f='${Status}' "$package" 2>/dev/null | grep -q "install ok installed" ||
        missing+=("$package")
done
[ ${#missing[@]} -eq 0 ] && exit 0

sudo=""
[ "$(id -u)" -ne 0 ] && sudo="sudo"
echo "Installing: ${missing[*]}"
$sudo apt-get update -qq
DEBIAN_FRONTEND=noninteractive $sudo apt-get install -y -qq --no-install-recommends "${missing[@]}"
