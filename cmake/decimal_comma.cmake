# tarn_make_decimal_comma(FOLDER): generates a locale with a decimal comma, because minimal systems have none.
# Programs find it with LOCPATH=FOLDER. Does nothing without localedef.
function(tarn_make_decimal_comma folder)
    find_program(TARN_ENGINE_BASE_localedef localedef)
    if(NOT TARN_ENGINE_BASE_localedef OR EXISTS "${folder}/de_DE.UTF-8")
        return()
    endif()
    file(MAKE_DIRECTORY "${folder}")
    set(order --little-endian)
    if(CMAKE_CXX_BYTE_ORDER STREQUAL "BIG_ENDIAN")
        set(order --big-endian)
    endif()
    execute_process(
        COMMAND "${TARN_ENGINE_BASE_localedef}" ${order} -i de_DE -f UTF-8 "${folder}/de_DE.UTF-8"
        RESULT_VARIABLE failed)
    if(failed)
        message(FATAL_ERROR "There is no locale with a decimal comma")
    endif()
endfunction()
