# Makes the imported target vornjsondb::jsoncpp, for the build and for users of the installed
# package alike. Where JsonCpp is missing there is no such target afterwards.
#
# JsonCpp's own package files are not loaded: those of several releases stop with an error when
# they are loaded twice in one project, which would break every user who also asks for JsonCpp.

# A project that already has JsonCpp, built or found, keeps the one it has.
function(vornjsondb_adopt_jsoncpp)
    foreach(target JsonCpp::JsonCpp jsoncpp_lib jsoncpp_static)
        if(TARGET ${target})
            add_library(vornjsondb::jsoncpp INTERFACE IMPORTED)
            set_target_properties(vornjsondb::jsoncpp PROPERTIES
                INTERFACE_LINK_LIBRARIES ${target})
            return()
        endif()
    endforeach()
endfunction()

function(vornjsondb_find_jsoncpp)
    # pkg-config only gives hints: a cross build may well have none for its target.
    find_package(PkgConfig QUIET)
    if(PKG_CONFIG_FOUND)
        pkg_check_modules(VORNJSONDB_PC_JSONCPP QUIET jsoncpp)
    endif()
    find_path(VORNJSONDB_JSONCPP_INCLUDE_DIR json/json.h
        HINTS ${VORNJSONDB_PC_JSONCPP_INCLUDE_DIRS}
        PATH_SUFFIXES jsoncpp)
    find_library(VORNJSONDB_JSONCPP_LIBRARY jsoncpp
        HINTS ${VORNJSONDB_PC_JSONCPP_LIBRARY_DIRS})
    mark_as_advanced(VORNJSONDB_JSONCPP_INCLUDE_DIR VORNJSONDB_JSONCPP_LIBRARY)
    if(VORNJSONDB_JSONCPP_INCLUDE_DIR AND VORNJSONDB_JSONCPP_LIBRARY)
        add_library(vornjsondb::jsoncpp UNKNOWN IMPORTED)
        set_target_properties(vornjsondb::jsoncpp PROPERTIES
            IMPORTED_LOCATION "${VORNJSONDB_JSONCPP_LIBRARY}"
            INTERFACE_INCLUDE_DIRECTORIES "${VORNJSONDB_JSONCPP_INCLUDE_DIR}")
    endif()
endfunction()

if(NOT TARGET vornjsondb::jsoncpp)
    vornjsondb_adopt_jsoncpp()
endif()
if(NOT TARGET vornjsondb::jsoncpp)
    vornjsondb_find_jsoncpp()
endif()
