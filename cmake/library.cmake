# tarn_add_library(NAME EXPORTS): declares a library; its sources are added afterwards. NAME is "engine_base" for
# libtarn_engine_base, EXPORTS is the linker's version script.

# Shared unless BUILD_SHARED_LIBS is OFF.
set(library_type SHARED)
if(DEFINED BUILD_SHARED_LIBS AND NOT BUILD_SHARED_LIBS)
    set(library_type STATIC)
endif()

function(tarn_add_library name exports)
    set(library tarn_${name})
    string(TOUPPER "${library}" macro)
    add_library(${library} ${library_type})
    add_library(tarn::${name} ALIAS ${library})
    set_target_properties(${library} PROPERTIES
        VERSION ${PROJECT_VERSION}
        SOVERSION ${PROJECT_VERSION_MAJOR}
        EXPORT_NAME ${name}
        CXX_VISIBILITY_PRESET hidden)
    if(NOT EMSCRIPTEN)  # A static library may be linked into a shared one.
        set_target_properties(${library} PROPERTIES POSITION_INDEPENDENT_CODE ON)
    endif()
    if(NOT WIN32)  # There it would remove inline functions from the DLL.
        set_target_properties(${library} PROPERTIES VISIBILITY_INLINES_HIDDEN ON)
    endif()
    target_compile_features(${library} PUBLIC cxx_std_17)
    target_compile_definitions(${library} PRIVATE ${macro}_BUILDING)
    if(library_type STREQUAL STATIC)
        target_compile_definitions(${library} PUBLIC ${macro}_STATIC)
    endif()
    target_include_directories(${library} PUBLIC "$<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}>")
    if(CMAKE_CXX_COMPILER_ID MATCHES "GNU|Clang")
        # A fused multiply-add rounds once, the formulas twice.
        target_compile_options(${library} PRIVATE -ffp-contract=off)
        if(CMAKE_SYSTEM_PROCESSOR MATCHES "^(i.86|x86_64|AMD64)$" AND CMAKE_SIZEOF_VOID_P EQUAL 4)
            # The x87 FPU computes with more bits than a double has.
            target_compile_options(${library} PRIVATE -msse2 -mfpmath=sse)
        endif()
    endif()
    if(UNIX AND NOT APPLE AND NOT EMSCRIPTEN)
        # Calls inside the library are direct; those to other libraries need no PLT stub.
        target_compile_options(${library} PRIVATE -fno-semantic-interposition -fno-plt)
        # Instantiated templates of the standard library are visible unless the linker hides them.
        target_link_options(${library} PRIVATE "LINKER:--version-script=${exports}"
            LINKER:-Bsymbolic-functions LINKER:-z,now)
        set_property(TARGET ${library} APPEND PROPERTY LINK_DEPENDS "${exports}")
    endif()
    if(TARN_ENGINE_BASE_TOP)
        # The options are copied: a static library exports what it links to.
        target_compile_options(${library} PRIVATE
            $<TARGET_PROPERTY:tarn_warnings,INTERFACE_COMPILE_OPTIONS>)
    endif()
endfunction()
