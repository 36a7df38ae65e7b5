# Finds what the command needs beyond both libraries. What is missing is named at once, with what to do.

find_package(CLI11 CONFIG QUIET)
find_package(RapidJSON CONFIG QUIET)
find_path(VORNJSONDB_LIBCSV_INCLUDE_DIR csv.h)
find_library(VORNJSONDB_LIBCSV_LIBRARY csv)
find_path(VORNJSONDB_RAPIDJSON_INCLUDE_DIR rapidjson/reader.h HINTS ${RapidJSON_INCLUDE_DIRS})
find_path(VORNJSONDB_UTF8PROC_INCLUDE_DIR utf8proc.h)
find_library(VORNJSONDB_UTF8PROC_LIBRARY utf8proc)

set(VORNJSONDB_MISSING "")
if(NOT CLI11_FOUND)
    string(APPEND VORNJSONDB_MISSING " libcli11-dev")
endif()
if(NOT VORNJSONDB_LIBCSV_INCLUDE_DIR OR NOT VORNJSONDB_LIBCSV_LIBRARY)
    string(APPEND VORNJSONDB_MISSING " libcsv-dev")
endif()
if(NOT VORNJSONDB_UTF8PROC_INCLUDE_DIR OR NOT VORNJSONDB_UTF8PROC_LIBRARY)
    string(APPEND VORNJSONDB_MISSING " libutf8proc-dev")
endif()
if(NOT VORNJSONDB_RAPIDJSON_INCLUDE_DIR)
    string(APPEND VORNJSONDB_MISSING " rapidjson-dev")
endif()
if(VORNJSONDB_MISSING)
    message(FATAL_ERROR
        "The command vornjsondb needs what these Debian packages hold:${VORNJSONDB_MISSING}. "
        "-DVORNJSONDB_COMMAND=OFF leaves the command out.")
endif()
