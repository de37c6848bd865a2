# The Debian packages that each use of the project needs, and how they are installed. Sourced by ./dev.

build_packages=(
  g++ make cmake ninja-build ccache pkg-config
  libglib2.0-dev libexpat1-dev libpugixml-dev libsqlite3-dev libsqlitecpp-dev libsodium-dev libcli11-dev libpng-dev libkrb5-dev
  libsecret-1-dev libx11-dev
  libgstreamer1.0-dev libgstreamer-plugins-base1.0-dev
  qt6-base-dev
  libgtest-dev libgmock-dev
)

# The library itself brings what it links (libsecret-1-0, libsodium23, ...); passwords are kept where the desktop has a
# Secret Service, such as gnome-keyring, and servers are found where there is an avahi-daemon.
#
# GStreamer's elements: capture (PipeWire, PulseAudio, X11), encoders and muxers.
run_packages=(
  gstreamer1.0-plugins-base gstreamer1.0-plugins-good gstreamer1.0-plugins-bad gstreamer1.0-plugins-ugly
  gstreamer1.0-libav gstreamer1.0-pipewire gstreamer1.0-pulseaudio gstreamer1.0-x
)

# A camera, a microphone and a screen for machines that have none.
headless_packages=(dbus pipewire pipewire-bin pipewire-pulse wireplumber libspa-0.2-modules xvfb)

# All that a login can meet, and a screen for machines that have none.
login_packages=(dbus gnome-keyring avahi-daemon iproute2 krb5-kdc krb5-admin-server krb5-user xvfb jwm fonts-dejavu-core)

demo_packages=("${headless_packages[@]}" gstreamer1.0-tools ffmpeg)
test_packages=("${headless_packages[@]}" "${login_packages[@]}" gstreamer1.0-tools ffmpeg polkitd xdg-desktop-portal man-db mandoc zsh
  at-spi2-core gir1.2-atspi-2.0 python3-gi x11-xserver-utils xdotool)
bench_packages=(libbenchmark-dev libxml2-dev libpipewire-0.3-dev gstreamer1.0-tools bsdextrautils dbus gnome-keyring xvfb jwm)
# The pictures of the login panel and the recorder: an optimiser, the letters that they show, a desktop's own style, and a
# desktop with light and dark colours that a script uses by keyboard and mouse.
picture_packages=("${headless_packages[@]}" gstreamer1.0-tools optipng fonts-dejavu-core fonts-ipaexfont-gothic
  adwaita-qt6 imagemagick jwm qt6ct x11-utils xdotool)
# The site of the documentation.
site_packages=(doxygen python3)
package_packages=(dpkg-dev file lintian desktop-file-utils appstream debootstrap)
check_packages=(clang-format-14 git python3)
lint_packages=(clang-14 clang-tidy-14 libclang-rt-14-dev python3)
coverage_packages=(llvm-14)

# install_packages NAME...: installs those that are missing, and says nothing when none is.
install_packages() {
  local missing=() package as_root=()
  for package in "$@"; do
    [ "$(dpkg-query --show --showformat='${db:Status-Status}' "$package" 2>/dev/null)" = installed ] ||
      missing+=("$package")
  done
  [ ${#missing[@]} -gt 0 ] || return 0
  if [ "$(id -u)" -ne 0 ]; then
    command -v sudo >/dev/null || {
      echo "dev: these packages are missing, and there is no sudo to install them with: ${missing[*]}" >&2
      return 1
    }
    as_root=(sudo)
  fi
  echo "Installing: ${missing[*]}" >&2
  local log
  log=$(mktemp)
  if ! { "${as_root[@]}" apt-get update &&
    "${as_root[@]}" env DEBIAN_FRONTEND=noninteractive apt-get install -y --no-install-recommends "${missing[@]}"; } \
    >"$log" 2>&1; then
    tail -n 20 "$log" >&2
    rm -f "$log"
    echo "dev: the packages could not be installed: ${missing[*]}" >&2
    return 1
  fi
  rm -f "$log"
}
