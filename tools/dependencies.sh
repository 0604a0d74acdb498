# Sourced by run and check: installs the Debian packages that are missing. Needs root or sudo only when some are.

BUILD_PACKAGES=(g++ cmake ninja-build pkg-config gettext librsvg2-bin
  libefl-all-dev libcairo2-dev libglib2.0-dev libsystemd-dev libicu-dev libsqlite3-dev libpulse-dev
  libgstreamer1.0-dev libgstreamer-plugins-base1.0-dev libavformat-dev libavcodec-dev libavutil-dev libx11-dev libxext-dev libxss-dev)
RUN_PACKAGES=(gstreamer1.0-plugins-base gstreamer1.0-plugins-good gstreamer1.0-plugins-bad gstreamer1.0-plugins-ugly
  gstreamer1.0-libav gstreamer1.0-pulseaudio fonts-dejavu-core xdg-utils)
DISPLAYLESS_PACKAGES=(xvfb openbox xdotool x11-utils imagemagick pulseaudio pulseaudio-utils espeak-ng ffmpeg)
TEST_PACKAGES=(libgtest-dev libgmock-dev sox dbus dbus-x11 systemd python3-dbusmock playerctl gstreamer1.0-tools at-spi2-core)

have_package() { dpkg-query -W -f='${db:Status-Status}\n' "$1" 2>/dev/null | grep -qx installed; }

need_packages() {
  local missing=() package as_root=()
  if ! command -v dpkg-query >/dev/null; then
    echo "This is no Debian system; going on with what is installed." >&2
    return 0
  fi
  # One query for all; only if that finds a gap is each asked for alone.
  if [ "$(dpkg-query -W -f='${db:Status-Status}\n' "$@" 2>/dev/null | grep -cx installed)" -ge $# ]; then
    return 0
  fi
  for package in "$@"; do
    have_package "$package" || missing+=("$package")
  done
  [ ${#missing[@]} -eq 0 ] && return 0
  echo "Installing: ${missing[*]}" >&2
  [ "$(id -u)" -eq 0 ] || as_root=(sudo)
  "${as_root[@]}" env DEBIAN_FRONTEND=noninteractive apt-get update -q >&2
  "${as_root[@]}" env DEBIAN_FRONTEND=noninteractive apt-get install -y -q --no-install-recommends "${missing[@]}" >&2
}

# build_preset PRESET [TARGET...]: configures once, then builds; without a target what the preset names.
build_preset() {
  local preset=$1
  shift
  if [ ! -f "build/$preset/build.ninja" ]; then
    cmake --preset "$preset" >"build-$preset.log" 2>&1 || { cat "build-$preset.log" >&2; rm -f "build-$preset.log"; return 1; }
    mv "build-$preset.log" "build/$preset/configure.log"
  fi
  cmake --build --preset "$preset" ${1:+--target "$@"}
}
