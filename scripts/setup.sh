#!/usr/bin/env bash
# Installs everything the build, the tests and the benchmarks need.
# Idempotent: when every package is already present it only checks and exits.
set -euo pipefail

# libpng-dev: the zor tool's PNG files; pkgconf: the package tests;
# valgrind: the conversions run under it.  chromium renders the demo
# gallery in one test, which is skipped where chromium cannot be installed.
native_pkgs=(cmake make g++ ccache libgtest-dev googletest libbenchmark-dev
             libopencv-dev libfftw3-dev valgrind libpng-dev pkgconf
             clang libclang-rt-dev)  # libFuzzer (make fuzz)
optional_pkgs=(chromium)
cross_pkgs=(g++-mingw-w64-i686)
wine_pkgs=(wine wine32:i386)

SUDO=""
if [ "$(id -u)" != 0 ]; then SUDO="sudo"; fi

missing=()
for p in "${native_pkgs[@]}" "${cross_pkgs[@]}" "${wine_pkgs[@]}" "${optional_pkgs[@]}"; do
  if ! dpkg-query -W -f='${Status}' "$p" 2>/dev/null | grep -q "install ok installed"; then
    missing+=("$p")
  fi
done

if [ "${#missing[@]}" -eq 0 ]; then
  exit 0
fi
echo "setup: installing ${missing[*]}"

# The 32-bit wine packages come only from the main suite; keep the security
# suite from pulling 64-bit libraries ahead of their 32-bit twins.
if ! dpkg --print-foreign-architectures | grep -qx i386; then
  $SUDO dpkg --add-architecture i386
fi
pref=/etc/apt/preferences.d/zor-i386-security
if [ ! -f "$pref" ]; then
  printf 'Package: *\nPin: release l=Debian-Security\nPin-Priority: 100\n' | $SUDO tee "$pref" >/dev/null
fi

export DEBIAN_FRONTEND=noninteractive
# A partial index failure (a mirror mid-sync) must not stop the install:
# what we need is usually still reachable from the suites that did load.
$SUDO apt-get update -q || echo "setup: apt-get update reported errors, going on"
required=()
optional=()
for p in "${missing[@]}"; do
  if [[ " ${optional_pkgs[*]} " == *" $p "* ]]; then optional+=("$p"); else required+=("$p"); fi
done
if [ "${#required[@]}" -gt 0 ]; then
  $SUDO apt-get install -y -q --no-install-recommends "${required[@]}"
fi
if [ "${#optional[@]}" -gt 0 ]; then
  $SUDO apt-get install -y -q --no-install-recommends "${optional[@]}" ||
    echo "setup: could not install ${optional[*]}; the tests that need it are skipped"
fi
