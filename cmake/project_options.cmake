# Options for building this project itself: never used when it is a dependency.

if(NOT CMAKE_BUILD_TYPE AND NOT CMAKE_CONFIGURATION_TYPES)
    set(CMAKE_BUILD_TYPE Release CACHE STRING "Debug, Release, RelWithDebInfo or MinSizeRel" FORCE)
endif()
set(CMAKE_EXPORT_COMPILE_COMMANDS ON)
# Debug builds check indices in containers.
add_compile_definitions($<$<CONFIG:Debug>:_GLIBCXX_ASSERTIONS>)
if(NOT DEFINED CMAKE_CXX_STANDARD)
    set(CMAKE_CXX_STANDARD 17)
endif()
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)

add_library(tarn_warnings INTERFACE)
if(CMAKE_CXX_COMPILER_ID MATCHES "GNU|Clang")
    target_compile_options(tarn_warnings INTERFACE -Wall -Wextra -Wpedantic -Wconversion -Wshadow)
    if(TARN_ENGINE_BASE_WARNINGS_AS_ERRORS)
        target_compile_options(tarn_warnings INTERFACE -Werror)
    endif()
    if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU" AND CMAKE_CXX_COMPILER_VERSION VERSION_LESS 13)
        # From C++20 on, g++ 12 wrongly warns of an overlap in "text" + std::string.
        target_compile_options(tarn_warnings INTERFACE -Wno-restrict)
    endif()
endif()
