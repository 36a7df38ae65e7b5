# What `cmake --install` lays down: the command with its manual and what shells complete; headers,
# libraries with their links, CMake package, pkg-config files.

set(VORNJSONDB_PACKAGE_DIR "${CMAKE_INSTALL_LIBDIR}/cmake/vornjsondb")

install(TARGETS vornjsondb EXPORT vornjsondbTargets
    LIBRARY DESTINATION "${CMAKE_INSTALL_LIBDIR}"
        COMPONENT runtime NAMELINK_COMPONENT development)
install(FILES include/VornJsonDbApi.h
    DESTINATION "${CMAKE_INSTALL_INCLUDEDIR}" COMPONENT development)

if(VORNJSONDB_TABLE)
    install(TARGETS vornjsondb_table EXPORT vornjsondbTargets
        ARCHIVE DESTINATION "${CMAKE_INSTALL_LIBDIR}" COMPONENT development)
    install(FILES include/VornJsonDbTable.h
        DESTINATION "${CMAKE_INSTALL_INCLUDEDIR}" COMPONENT development)
endif()

if(VORNJSONDB_COMMAND)
    install(TARGETS vornjsondb_command
        RUNTIME DESTINATION "${CMAKE_INSTALL_BINDIR}" COMPONENT runtime)
endif()
if(TARGET vornjsondb_pages)
    set(VORNJSONDB_PAGE_DIR "${PROJECT_BINARY_DIR}/cli/pages")
    install(FILES "${VORNJSONDB_PAGE_DIR}/man" RENAME vornjsondb.1
        DESTINATION "${CMAKE_INSTALL_MANDIR}/man1" COMPONENT runtime)
    install(FILES "${VORNJSONDB_PAGE_DIR}/bash" RENAME vornjsondb
        DESTINATION "${CMAKE_INSTALL_DATADIR}/bash-completion/completions" COMPONENT runtime)
    install(FILES "${VORNJSONDB_PAGE_DIR}/zsh" RENAME _vornjsondb
        DESTINATION "${CMAKE_INSTALL_DATADIR}/zsh/site-functions" COMPONENT runtime)
    install(FILES "${VORNJSONDB_PAGE_DIR}/fish" RENAME vornjsondb.fish
        DESTINATION "${CMAKE_INSTALL_DATADIR}/fish/vendor_completions.d" COMPONENT runtime)
endif()

install(EXPORT vornjsondbTargets NAMESPACE vornjsondb::
    DESTINATION "${VORNJSONDB_PACKAGE_DIR}" COMPONENT development)
configure_package_config_file(cmake/vornjsondbConfig.cmake.in vornjsondbConfig.cmake
    INSTALL_DESTINATION "${VORNJSONDB_PACKAGE_DIR}"
    NO_SET_AND_CHECK_MACRO)
write_basic_package_version_file(vornjsondbConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES
    "${CMAKE_CURRENT_BINARY_DIR}/vornjsondbConfig.cmake"
    "${CMAKE_CURRENT_BINARY_DIR}/vornjsondbConfigVersion.cmake"
    cmake/VornJsonDbJsonCpp.cmake
    DESTINATION "${VORNJSONDB_PACKAGE_DIR}" COMPONENT development)

# With the usual relative folders the prefix is taken from where the .pc file lies, so that
# `cmake --install --prefix` and a moved tree stay right.
set(VORNJSONDB_PC_DIR "${CMAKE_INSTALL_LIBDIR}/pkgconfig")
if(IS_ABSOLUTE "${CMAKE_INSTALL_LIBDIR}" OR IS_ABSOLUTE "${CMAKE_INSTALL_INCLUDEDIR}")
    set(VORNJSONDB_PC_PREFIX "${CMAKE_INSTALL_PREFIX}")
    set(VORNJSONDB_PC_LIBDIR "${CMAKE_INSTALL_FULL_LIBDIR}")
    set(VORNJSONDB_PC_INCLUDEDIR "${CMAKE_INSTALL_FULL_INCLUDEDIR}")
else()
    file(RELATIVE_PATH VORNJSONDB_PC_UP "/${VORNJSONDB_PC_DIR}" "/")
    string(REGEX REPLACE "/$" "" VORNJSONDB_PC_UP "${VORNJSONDB_PC_UP}")
    set(VORNJSONDB_PC_PREFIX "\${pcfiledir}/${VORNJSONDB_PC_UP}")
    set(VORNJSONDB_PC_LIBDIR "\${prefix}/${CMAKE_INSTALL_LIBDIR}")
    set(VORNJSONDB_PC_INCLUDEDIR "\${prefix}/${CMAKE_INSTALL_INCLUDEDIR}")
endif()
set(VORNJSONDB_PC_NAMES vornjsondb)
if(VORNJSONDB_TABLE)
    list(APPEND VORNJSONDB_PC_NAMES vornjsondb-table)
endif()
foreach(VORNJSONDB_PC_NAME IN LISTS VORNJSONDB_PC_NAMES)
    configure_file(cmake/${VORNJSONDB_PC_NAME}.pc.in ${VORNJSONDB_PC_NAME}.pc @ONLY)
    install(FILES "${CMAKE_CURRENT_BINARY_DIR}/${VORNJSONDB_PC_NAME}.pc"
        DESTINATION "${VORNJSONDB_PC_DIR}" COMPONENT development)
endforeach()
