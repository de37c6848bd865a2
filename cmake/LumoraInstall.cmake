# What an installation holds: the libraries, the public headers, the package files for CMake and pkg-config. The
# components are those of the Debian packages; programs set theirs in their folders.

include(CMakePackageConfigHelpers)
set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${PROJECT_SOURCE_DIR}/LumoraKit/LumoraKit.h)

set(CMAKE_INSTALL_DEFAULT_COMPONENT_NAME development)
install(TARGETS lumorakit EXPORT LumoraKitTargets LIBRARY COMPONENT library NAMELINK_COMPONENT development)
install(TARGETS lumorakit-testing EXPORT LumoraKitTargets)
# What LumoraKit.h includes is public, and nothing else is.
file(STRINGS ${PROJECT_SOURCE_DIR}/LumoraKit/LumoraKit.h public_headers REGEX "^#include <LumoraKit/")
list(TRANSFORM public_headers REPLACE "^#include <LumoraKit/(.*)>.*" "\\1")
file(GLOB fakes CONFIGURE_DEPENDS RELATIVE ${PROJECT_SOURCE_DIR}/LumoraKit ${PROJECT_SOURCE_DIR}/LumoraKit/testing/*.h)
foreach(header LumoraKit.h ${public_headers} ${fakes})
  get_filename_component(folder ${header} DIRECTORY)
  install(FILES ${PROJECT_SOURCE_DIR}/LumoraKit/${header} DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/LumoraKit/${folder})
endforeach()

if(LUMORAKIT_QT)
  install(TARGETS lumorakit-qt EXPORT LumoraKitTargets LIBRARY COMPONENT qt-library NAMELINK_COMPONENT development)
  install(FILES ${PROJECT_SOURCE_DIR}/LumoraKit/platform/qt/LumoraKitQt.h
          DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/LumoraKit/platform/qt)
endif()

set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/LumoraKit)
install(EXPORT LumoraKitTargets NAMESPACE LumoraKit:: DESTINATION ${package_dir})
configure_package_config_file(${CMAKE_CURRENT_LIST_DIR}/LumoraKitConfig.cmake.in
                              ${PROJECT_BINARY_DIR}/LumoraKitConfig.cmake INSTALL_DESTINATION ${package_dir})
write_basic_package_version_file(${PROJECT_BINARY_DIR}/LumoraKitConfigVersion.cmake COMPATIBILITY SameMinorVersion)
install(FILES ${PROJECT_BINARY_DIR}/LumoraKitConfig.cmake ${PROJECT_BINARY_DIR}/LumoraKitConfigVersion.cmake
        DESTINATION ${package_dir})

# Configured at installation, because the prefix may be given only then.
set(pkg_config_files lumorakit)
if(LUMORAKIT_QT)
  list(APPEND pkg_config_files lumorakit-qt)
endif()
foreach(file ${pkg_config_files})
  install(CODE "set(CMAKE_INSTALL_LIBDIR \"${CMAKE_INSTALL_LIBDIR}\")
set(CMAKE_INSTALL_INCLUDEDIR \"${CMAKE_INSTALL_INCLUDEDIR}\")
set(PROJECT_VERSION \"${PROJECT_VERSION}\")
set(PROJECT_DESCRIPTION \"${PROJECT_DESCRIPTION}\")
configure_file(\"${CMAKE_CURRENT_LIST_DIR}/${file}.pc.in\"
               \"\$ENV{DESTDIR}\${CMAKE_INSTALL_PREFIX}/${CMAKE_INSTALL_LIBDIR}/pkgconfig/${file}.pc\" @ONLY)")
endforeach()
