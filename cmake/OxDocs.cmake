# Documentation: the manual page of oxtool (installed with it), the guide and
# the table of messages (installed with the development files), and a `docs`
# target that writes the message table again from the library's own list of
# numbers and, when Doxygen is installed, builds the API reference from the
# headers into build/<preset>/docs/html.
configure_file(docs/oxtool.1.in ${PROJECT_BINARY_DIR}/docs/oxtool.1 @ONLY)
install(FILES docs/guide.md docs/messages.md
    DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT development)

add_custom_target(docs)
if(OXBASE_BUILD_TOOLS)
    add_custom_target(docs_messages
        COMMAND ${CMAKE_COMMAND} -DOXTOOL=$<TARGET_FILE:oxtool>
            -DMESSAGES=${PROJECT_SOURCE_DIR}/data/oxbase.msg
            -DOUTPUT=${PROJECT_SOURCE_DIR}/docs/messages.md
            -P ${PROJECT_SOURCE_DIR}/cmake/OxMessageTable.cmake
        DEPENDS oxtool
        COMMENT "Writing docs/messages.md from the numbers the library logs")
    add_dependencies(docs docs_messages)
endif()

find_package(Doxygen QUIET)
if(DOXYGEN_FOUND)
    set(DOXYGEN_PROJECT_NAME OxBase)
    set(DOXYGEN_PROJECT_NUMBER ${PROJECT_VERSION})
    set(DOXYGEN_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/docs)
    set(DOXYGEN_USE_MDFILE_AS_MAINPAGE ${PROJECT_SOURCE_DIR}/docs/guide.md)
    set(DOXYGEN_EXCLUDE_PATTERNS */detail/* */platform/*)
    set(DOXYGEN_EXTRACT_ALL YES)
    set(DOXYGEN_GENERATE_LATEX NO)
    set(DOXYGEN_WARN_IF_UNDOCUMENTED NO)
    doxygen_add_docs(docs_api
        ${PROJECT_SOURCE_DIR}/docs/guide.md ${PROJECT_SOURCE_DIR}/docs/messages.md
        ${PROJECT_SOURCE_DIR}/oxbase ${PROJECT_BINARY_DIR}/include/oxbase
        COMMENT "API reference by Doxygen into ${PROJECT_BINARY_DIR}/docs/html")
    add_dependencies(docs docs_api)
else()
    add_custom_command(TARGET docs POST_BUILD
        COMMAND ${CMAKE_COMMAND} -E echo "docs: Doxygen is not installed, so no API reference is built"
        VERBATIM)
endif()
