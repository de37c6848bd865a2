# Everything that is installed and called. pkg-config names are imported as targets: PkgConfig::NAME.

find_package(PkgConfig REQUIRED)
find_package(Threads REQUIRED)

function(lumora_pkg name)
  pkg_check_modules(${name} REQUIRED IMPORTED_TARGET GLOBAL ${ARGN})
endfunction()

lumora_pkg(GLIB glib-2.0>=2.74 gio-2.0 gobject-2.0)
lumora_pkg(GSTREAMER gstreamer-1.0>=1.22 gstreamer-app-1.0 gstreamer-audio-1.0 gstreamer-video-1.0)
lumora_pkg(X11 x11>=1.7)
lumora_pkg(EXPAT expat)
lumora_pkg(PUGIXML pugixml)
lumora_pkg(SQLITE sqlite3)
lumora_pkg(SODIUM libsodium)
lumora_pkg(SECRET libsecret-1>=0.20)
lumora_pkg(KRB5 krb5)

# The library of widgets is left out where Qt is not installed, unless it is asked for.
find_package(Qt6 6.4 QUIET COMPONENTS Widgets)
option(LUMORAKIT_QT "Build lumorakit-qt, the login panel as Qt widgets" ${Qt6_FOUND})
if(LUMORAKIT_QT)
  find_package(Qt6 6.4 REQUIRED COMPONENTS Widgets)
endif()
