# The Debian packages: one a component of the installation, made by `cpack -G DEB` (./dev packages).

set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME lumorakit)
set(CPACK_PACKAGE_CONTACT "Lumora maintainers <maintainers@lumora.example>")
# Each package has a summary of its own: without this the project's would stand before it.
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "")
set(CPACK_PACKAGE_DIRECTORY ${PROJECT_BINARY_DIR}/packages)
set(CPACK_STRIP_FILES ON)
set(CPACK_INSTALL_DEFAULT_DIRECTORY_PERMISSIONS OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ
                                                WORLD_EXECUTE)
# What policy wants in each package besides: its copyright and changes, and compressed manual pages.
set(CPACK_PRE_BUILD_SCRIPTS ${PROJECT_SOURCE_DIR}/packaging/debian/finish-packages.cmake)

set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${PROJECT_BINARY_DIR}/LumoraKit)
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS ON)
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS_POLICY >=)
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)

# lumora_package(COMPONENT NAME SECTION SUMMARY DESCRIPTION [CONTROL_FIELD VALUE]...)
macro(lumora_package component name section summary description)
  string(TOUPPER ${component} id)
  list(APPEND CPACK_COMPONENTS_ALL ${component})
  # Told to the script below, as every variable of this prefix is.
  list(APPEND CPACK_LUMORA_PACKAGES ${component}=${name})
  set(CPACK_DEBIAN_${id}_PACKAGE_NAME ${name})
  set(CPACK_DEBIAN_${id}_PACKAGE_SECTION ${section})
  set(CPACK_DEBIAN_${id}_DESCRIPTION "${summary}\n${description}")
  set(fields ${ARGN})
  while(fields)
    list(POP_FRONT fields field value)
    set(CPACK_DEBIAN_${id}_PACKAGE_${field} "${value}")
  endwhile()
endmacro()

set(needs_library "liblumorakit1 (= ${PROJECT_VERSION})")
lumora_package(
  library liblumorakit1 libs "client framework of the Lumora podcast production system"
  "Logs in to a Lumora server, records an episode from cameras, microphones, the
screen and remote cameras as one recording, and hands it to a workflow of the
server.
.
This package contains the shared library."
  # The elements that record: sources (PipeWire, PulseAudio, X11), converters, the muxer, an encoder of each kind.
  CONTROL_EXTRA ${PROJECT_SOURCE_DIR}/packaging/debian/triggers
  DEPENDS "gstreamer1.0-plugins-base, gstreamer1.0-plugins-good, gstreamer1.0-plugins-bad, gstreamer1.0-libav, gstreamer1.0-pipewire, gstreamer1.0-pulseaudio, gstreamer1.0-x"
  RECOMMENDS "gstreamer1.0-plugins-ugly, avahi-daemon, gnome-keyring | keepassxc"
  SUGGESTS "krb5-user, polkitd")
if(LUMORAKIT_QT)
  lumora_package(
    qt-library liblumorakit-qt1 libs "login panel of LumoraKit as Qt 6 widgets"
    "The login panel and its sheet, which find servers, sign on by themselves where
they can and remember what the user wants remembered, for applications of
Qt 6 Widgets that use LumoraKit.
.
This package contains the shared library."
    CONTROL_EXTRA ${PROJECT_SOURCE_DIR}/packaging/debian/triggers
    DEPENDS "${needs_library}")
  set(needs_qt_library ", liblumorakit-qt1 (= ${PROJECT_VERSION})")
endif()
lumora_package(
  development liblumorakit-dev libdevel "client framework of the Lumora podcast production system (development)"
  "Logs in to a Lumora server, records an episode from cameras, microphones, the
screen and remote cameras as one recording, and hands it to a workflow of the
server.
.
This package contains the headers, the files for CMake and pkg-config, and a
library of fakes with which an application tests itself without a server."
  DEPENDS "${needs_library}${needs_qt_library}"
  SUGGESTS "lumora-tools, qt6-base-dev, libgtest-dev")
lumora_package(
  tools lumora-tools utils "command-line client and sandbox server of the Lumora podcast production system"
  "The client lumora runs any operation of a Lumora server from a shell or a
script. lumora-sandbox is a self-contained stand-in for a server to develop and
try against, with its helper agent. recordertester tries the capture devices of
this machine."
  DEPENDS "${needs_library}"
  RECOMMENDS "bash-completion, default-dbus-system-bus, polkitd"
  SUGGESTS "avahi-daemon, krb5-user")
if(TARGET lumora-recorder)
  lumora_package(
    recorder lumora-recorder video "record and submit podcast episodes to a Lumora server"
    "Records an episode from cameras, microphones, the screen and remote cameras of
a Lumora server as one recording, and submits it to a workflow of the server.
What could not be submitted is kept and tried again, and what a crash left
unfinished is found and repaired."
    DEPENDS "${needs_library}${needs_qt_library}"
    RECOMMENDS "pipewire-pulse | pulseaudio, wireplumber")
endif()

include(CPack)
