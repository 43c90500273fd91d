#!/usr/bin/env bash
# Installs every Debian 12 package the project needs to build, test, fuzz and benchmark.
# Safe to run again: packages already present are left as they are.
set -euo pipefail

packages=(
  # toolchain
  build-essential cmake ninja-build pkg-config ccache clang libclang-rt-14-dev
  # toolkit and libraries
  libwxgtk3.2-dev libgtk-3-dev libzip-dev zlib1g-dev
  libavformat-dev libavcodec-dev libswresample-dev libswscale-dev libavutil-dev
  libcdio-dev libcdio-paranoia-dev libburn-dev libisofs-dev libsdl2-dev libuchardet-dev
  # tests and benchmarks
  googletest libgtest-dev libbenchmark-dev xvfb xauth x11-utils imagemagick ffmpeg hyperfine time
  xorriso
  # man pages, and the checks of the desktop files and the package
  scdoc desktop-file-utils appstream lintian bash-completion
)

sudo_cmd=()
if [ "$(id -u)" -ne 0 ]; then
  sudo_cmd=(sudo)
fi

missing=()
for p in "${packages[@]}"; do
  if ! dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q 'install ok installed'; then
    missing+=("$p")
  fi
done

if [ ${#missing[@]} -eq 0 ]; then
  echo "install-deps: all ${#packages[@]} packages present"
  exit 0
fi

echo "install-deps: installing ${missing[*]}"
"${sudo_cmd[@]}" apt-get update -qq
DEBIAN_FRONTEND=noninteractive "${sudo_cmd[@]}" apt-get install -y -qq --no-install-recommends "${missing[@]}"
