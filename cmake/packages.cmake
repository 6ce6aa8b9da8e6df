# Debian packages, by `cpack -G DEB`: the libraries, their development files, their debug symbols, and the Python
# module.

set(CPACK_PACKAGE_NAME tarn-engine-base)
set(CPACK_PACKAGE_VENDOR "Tarn")
set(CPACK_PACKAGE_CONTACT "Tarn Engine developers <engine@tarn.invalid>")
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(components runtime development)
if(TARN_ENGINE_BASE_BUILD_DOCUMENT)
    list(APPEND components document)
endif()
if(TARN_ENGINE_BASE_BUILD_PYTHON)
    list(APPEND components python)
endif()
set(CPACK_COMPONENTS_ALL ${components})
set(CPACK_COMPONENTS_GROUPING ONE_PER_GROUP)
set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_RELEASE 1)
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "values and graphs of a node-based animation engine")

set(runtime_package "libtarn-engine-base${PROJECT_VERSION_MAJOR}")
set(document_package "libtarn-engine-document${PROJECT_VERSION_MAJOR}")
set(development_package libtarn-engine-base-dev)
set(python_package python3-tarn-engine-base)
set(about "The tagged value and its conversions, free-form data, the records of the patch
graph and the queries over them, vector paths, easing curves, layers and
naming tables.")
set(CPACK_DEBIAN_RUNTIME_PACKAGE_NAME "${runtime_package}")
set(CPACK_DEBIAN_RUNTIME_PACKAGE_SECTION libs)
set(CPACK_DEBIAN_RUNTIME_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_RUNTIME_DEBUGINFO_PACKAGE ON)
set(CPACK_COMPONENT_RUNTIME_DESCRIPTION "${about}")
set(CPACK_DEBIAN_DOCUMENT_PACKAGE_NAME "${document_package}")
set(CPACK_DEBIAN_DOCUMENT_PACKAGE_SECTION libs)
set(CPACK_DEBIAN_DOCUMENT_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS "${CMAKE_CURRENT_BINARY_DIR}")
set(CPACK_DEBIAN_DOCUMENT_PACKAGE_DEPENDS "${runtime_package} (= ${PROJECT_VERSION}-1)")
set(CPACK_DEBIAN_DOCUMENT_DEBUGINFO_PACKAGE ON)
set(CPACK_COMPONENT_DOCUMENT_DESCRIPTION "Reads graphs of patches from JSON documents, its own and
those that browser-based node editors export, and writes them.")
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_NAME "${development_package}")
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_SECTION libdevel)
set(needs_document "")
if(TARN_ENGINE_BASE_BUILD_DOCUMENT)
    set(needs_document "${document_package} (= ${PROJECT_VERSION}-1), ")
endif()
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_DEPENDS
    "${runtime_package} (= ${PROJECT_VERSION}-1), ${needs_document}libboost-dev (>= ${TARN_ENGINE_BASE_BOOST})")
set(CPACK_COMPONENT_DEVELOPMENT_DESCRIPTION
    "${about}\nThis package has the headers, CMake and pkg-config files, and debuggers' views.")

# For the Python version that the module is compiled for.
if(TARN_ENGINE_BASE_BUILD_PYTHON)
    math(EXPR next_minor "${Python_VERSION_MINOR} + 1")
    set(python_version "${Python_VERSION_MAJOR}.${Python_VERSION_MINOR}")
    set(CPACK_DEBIAN_PYTHON_PACKAGE_NAME "${python_package}")
    set(CPACK_DEBIAN_PYTHON_PACKAGE_SECTION python)
    set(CPACK_DEBIAN_PYTHON_PACKAGE_SHLIBDEPS ON)
    set(CPACK_DEBIAN_PYTHON_PACKAGE_DEPENDS "${document_package} (= ${PROJECT_VERSION}-1), python3 (>= ${python_version}~), \
python3 (<< ${Python_VERSION_MAJOR}.${next_minor}), python3-numpy")
    set(CPACK_DEBIAN_PYTHON_DEBUGINFO_PACKAGE ON)
    set(CPACK_COMPONENT_PYTHON_DESCRIPTION "${about}\nThis package has the Python module tarn_engine_base.")
endif()

# The dependency of programs that link with the library, and the trigger for ldconfig.
set(control "${CMAKE_CURRENT_BINARY_DIR}/debian-control")
file(WRITE "${control}/base/shlibs"
    "libtarn_engine_base ${PROJECT_VERSION_MAJOR} ${runtime_package} (>= ${PROJECT_VERSION})\n")
file(WRITE "${control}/document/shlibs"
    "libtarn_engine_document ${PROJECT_VERSION_MAJOR} ${document_package} (>= ${PROJECT_VERSION})\n")
file(WRITE "${control}/triggers" "activate-noawait ldconfig\n")
# Python's byte code is compiled when the package is installed, and removed with it.
foreach(script postinst:py3compile prerm:py3clean)
    string(REPLACE ":" ";" script "${script}")
    list(GET script 0 name)
    list(GET script 1 command)
    file(WRITE "${control}/python/${name}" "#!/bin/sh
set -e
if command -v ${command} > /dev/null; then ${command} -p ${python_package}; fi
")
endforeach()
set(CPACK_DEBIAN_PYTHON_PACKAGE_CONTROL_EXTRA "${control}/python/postinst;${control}/python/prerm")
set(CPACK_DEBIAN_RUNTIME_PACKAGE_CONTROL_EXTRA "${control}/base/shlibs;${control}/triggers")
set(CPACK_DEBIAN_DOCUMENT_PACKAGE_CONTROL_EXTRA "${control}/document/shlibs;${control}/triggers")
set(CPACK_DEBIAN_RUNTIME_PACKAGE_CONTROL_STRICT_PERMISSION ON)
set(CPACK_DEBIAN_DOCUMENT_PACKAGE_CONTROL_STRICT_PERMISSION ON)
set(CPACK_DEBIAN_PYTHON_PACKAGE_CONTROL_STRICT_PERMISSION ON)

# Each package contains its licence and changelog, as Debian requires.
string(TIMESTAMP date "%a, %d %b %Y %H:%M:%S +0000" UTC)
string(TIMESTAMP year "%Y" UTC)
find_program(GZIP gzip)
file(READ LICENSE license)
file(WRITE "${control}/copyright" "Copyright ${year} the Tarn Engine developers\n\n${license}")
foreach(component ${components})
    set(package "${${component}_package}")
    install(FILES "${control}/copyright" DESTINATION "${CMAKE_INSTALL_DATADIR}/doc/${package}"
        COMPONENT ${component})
    set(changelog "${control}/${package}.changelog")
    file(WRITE "${changelog}" "tarn-engine-base (${PROJECT_VERSION}-1) unstable; urgency=medium

  * See CHANGELOG.md of the sources.

 -- ${CPACK_PACKAGE_CONTACT}  ${date}
")
    if(GZIP)
        execute_process(COMMAND "${GZIP}" -9nf "${changelog}")
        install(FILES "${changelog}.gz" DESTINATION "${CMAKE_INSTALL_DATADIR}/doc/${package}"
            RENAME changelog.Debian.gz COMPONENT ${component})
    endif()
endforeach()

include(CPack)
