# Installation rules. The library and its development files are two components, and two Debian packages.

include(CMakePackageConfigHelpers)
include(GNUInstallDirs)

set(cmake_dir "${CMAKE_INSTALL_LIBDIR}/cmake/${PROJECT_NAME}")
set(pkgconfig_dir "${CMAKE_INSTALL_LIBDIR}/pkgconfig")

# The library, its headers and its pkg-config file. Headers in detail/ are private.
function(tarn_install_library library folder component)
    install(TARGETS ${library}
        EXPORT TarnEngineBaseTargets
        LIBRARY DESTINATION "${CMAKE_INSTALL_LIBDIR}" COMPONENT ${component}
            NAMELINK_COMPONENT development
        RUNTIME DESTINATION "${CMAKE_INSTALL_BINDIR}" COMPONENT ${component}
        ARCHIVE DESTINATION "${CMAKE_INSTALL_LIBDIR}" COMPONENT development
        INCLUDES DESTINATION "${CMAKE_INSTALL_INCLUDEDIR}")
    install(DIRECTORY Engine/${folder}
        DESTINATION "${CMAKE_INSTALL_INCLUDEDIR}/Engine" COMPONENT development
        FILES_MATCHING PATTERN "*.h"
        PATTERN "detail" EXCLUDE)
    configure_file(cmake/${library}.pc.in "${CMAKE_CURRENT_BINARY_DIR}/${library}.pc" @ONLY)
    install(FILES "${CMAKE_CURRENT_BINARY_DIR}/${library}.pc"
        DESTINATION "${pkgconfig_dir}" COMPONENT development)
endfunction()

# Relative to its own location, so that the installed tree can be moved.
file(RELATIVE_PATH TARN_ENGINE_BASE_PREFIX_FROM_PC "/${pkgconfig_dir}" "/")
string(REGEX REPLACE "/$" "" TARN_ENGINE_BASE_PREFIX_FROM_PC "${TARN_ENGINE_BASE_PREFIX_FROM_PC}")
set(TARN_ENGINE_BASE_PC_DEFINITIONS "")
set(TARN_ENGINE_DOCUMENT_PC_DEFINITIONS "")
if(library_type STREQUAL STATIC)
    set(TARN_ENGINE_BASE_PC_DEFINITIONS " -DTARN_ENGINE_BASE_STATIC")
    set(TARN_ENGINE_DOCUMENT_PC_DEFINITIONS " -DTARN_ENGINE_DOCUMENT_STATIC")
endif()
tarn_install_library(tarn_engine_base Base runtime)
if(TARN_ENGINE_BASE_BUILD_DOCUMENT)
    tarn_install_library(tarn_engine_document Document document)
endif()
install(EXPORT TarnEngineBaseTargets
    NAMESPACE tarn:: DESTINATION "${cmake_dir}" COMPONENT development)
# For projects that export their build tree, with the library in it.
export(EXPORT TarnEngineBaseTargets
    NAMESPACE tarn:: FILE "${CMAKE_CURRENT_BINARY_DIR}/TarnEngineBaseTargets.cmake")

if(NOT TARN_ENGINE_BASE_DEBIAN_PACKAGES)
    install(FILES LICENSE DESTINATION "${CMAKE_INSTALL_DATADIR}/doc/tarn-engine-base" COMPONENT development)
endif()

configure_package_config_file(cmake/TarnEngineBaseConfig.cmake.in
    "${CMAKE_CURRENT_BINARY_DIR}/TarnEngineBaseConfig.cmake"
    INSTALL_DESTINATION "${cmake_dir}")
write_basic_package_version_file("${CMAKE_CURRENT_BINARY_DIR}/TarnEngineBaseConfigVersion.cmake"
    COMPATIBILITY SameMajorVersion)
install(FILES
    "${CMAKE_CURRENT_BINARY_DIR}/TarnEngineBaseConfig.cmake"
    "${CMAKE_CURRENT_BINARY_DIR}/TarnEngineBaseConfigVersion.cmake"
    DESTINATION "${cmake_dir}" COMPONENT development)

# gdb loads a script by the full name of the library, from its auto-load folder.
if(UNIX AND library_type STREQUAL SHARED)
    install(FILES tools/gdb/tarn_engine_base.py
        DESTINATION "${CMAKE_INSTALL_DATADIR}/gdb/auto-load${CMAKE_INSTALL_FULL_LIBDIR}"
        RENAME "libtarn_engine_base.so.${PROJECT_VERSION}-gdb.py" COMPONENT development)
endif()
install(FILES tools/gdb/tarn_engine_base.py
    DESTINATION "${CMAKE_INSTALL_DATADIR}/tarn-engine-base/gdb" COMPONENT development)
install(FILES tools/lldb/tarn_engine_base_lldb.py
    DESTINATION "${CMAKE_INSTALL_DATADIR}/tarn-engine-base/lldb" COMPONENT development)
install(FILES tools/natvis/tarn_engine_base.natvis
    DESTINATION "${CMAKE_INSTALL_DATADIR}/tarn-engine-base/natvis" COMPONENT development)
