# What an installation holds: the libraries, the public headers, the package files for CMake and pkg-config.

include(CMakePackageConfigHelpers)

install(TARGETS lumorakit lumorakit-testing EXPORT LumoraKitTargets)
install(
  DIRECTORY ${PROJECT_SOURCE_DIR}/LumoraKit
  DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}
  FILES_MATCHING
  PATTERN "*.h"
  PATTERN linux EXCLUDE
  PATTERN resources EXCLUDE)

set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/LumoraKit)
install(EXPORT LumoraKitTargets NAMESPACE LumoraKit:: DESTINATION ${package_dir})
configure_package_config_file(${CMAKE_CURRENT_LIST_DIR}/LumoraKitConfig.cmake.in
                              ${PROJECT_BINARY_DIR}/LumoraKitConfig.cmake INSTALL_DESTINATION ${package_dir})
write_basic_package_version_file(${PROJECT_BINARY_DIR}/LumoraKitConfigVersion.cmake COMPATIBILITY SameMinorVersion)
install(FILES ${PROJECT_BINARY_DIR}/LumoraKitConfig.cmake ${PROJECT_BINARY_DIR}/LumoraKitConfigVersion.cmake
        DESTINATION ${package_dir})

# Configured at installation, because the prefix may be given only then.
install(CODE "set(CMAKE_INSTALL_LIBDIR \"${CMAKE_INSTALL_LIBDIR}\")
set(CMAKE_INSTALL_INCLUDEDIR \"${CMAKE_INSTALL_INCLUDEDIR}\")
set(PROJECT_VERSION \"${PROJECT_VERSION}\")
set(PROJECT_DESCRIPTION \"${PROJECT_DESCRIPTION}\")
configure_file(\"${CMAKE_CURRENT_LIST_DIR}/lumorakit.pc.in\"
               \"\$ENV{DESTDIR}\${CMAKE_INSTALL_PREFIX}/${CMAKE_INSTALL_LIBDIR}/pkgconfig/lumorakit.pc\" @ONLY)")
