# Reads the version from version.h, its only place, into `version`. `cmake -P` prints it.
file(STRINGS "${CMAKE_CURRENT_LIST_DIR}/../Engine/Base/version.h" version_lines REGEX "define TARN_.*_[A-Z]+ [0-9]+$")
string(REGEX MATCHALL "[0-9]+" version_numbers "${version_lines}")
list(JOIN version_numbers "." version)
if(CMAKE_SCRIPT_MODE_FILE)
    execute_process(COMMAND "${CMAKE_COMMAND}" -E echo "${version}")
endif()
