# The Debian packages that CPack makes of what `cmake --install` gives, one of each component.
# scripts/package builds and packs them.
set(packaging ${PROJECT_SOURCE_DIR}/packaging)

# The changelog says which packaging of a version this is, and who answers for it. The revision begins
# with 0, so that packages of Debian's own would come after these.
file(STRINGS ${packaging}/changelog changelog_entry LIMIT_COUNT 1)
file(STRINGS ${packaging}/changelog changelog_signature LIMIT_COUNT 1 REGEX "^ -- ")
set_property(DIRECTORY ${PROJECT_SOURCE_DIR} APPEND PROPERTY
  CMAKE_CONFIGURE_DEPENDS ${packaging}/changelog)
string(REGEX MATCH "\\((.+)-([^-]+)\\)" changelog_version "${changelog_entry}")
set(changelog_version ${CMAKE_MATCH_1})
set(CPACK_DEBIAN_PACKAGE_RELEASE ${CMAKE_MATCH_2})
if(NOT changelog_version VERSION_EQUAL PROJECT_VERSION)
  message(FATAL_ERROR "packaging/changelog begins with version ${changelog_version}. "
    "Add an entry for ${PROJECT_VERSION}.")
endif()
string(REGEX MATCH "-- (.+>)" changelog_signature "${changelog_signature}")
set(CPACK_PACKAGE_CONTACT ${CMAKE_MATCH_1})

set(CPACK_VERBATIM_VARIABLES ON)
set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_STRIP_FILES ON)
# Each package has a summary of its own, the first line of its description.
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "")
set(CPACK_PRE_BUILD_SCRIPTS ${packaging}/AddDocumentation.cmake)
set(CPACK_POST_BUILD_SCRIPTS ${packaging}/DropLdconfigCalls.cmake)
set(CPACK_WORDCATCHER_PACKAGING ${packaging})

set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_COMPRESSION_TYPE xz)
set(CPACK_DEBIAN_PACKAGE_SOURCE wordcatcher)
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${PROJECT_BINARY_DIR}/wordcatcher)

set(about "\
Wordcatcher finds names, titles and labels that were stored earlier inside
free text, and tolerates spelling mistakes. Each phrase that it finds comes
with the data that was stored with it and with its distance in edits.
")
set(library_package libwordcatcher${PROJECT_VERSION_MAJOR})
# dpkg-shlibdeps knows the packages that are installed, and so not this one.
set(library_dependency "${library_package} (>= ${PROJECT_VERSION})")

set(CPACK_DEBIAN_LIBRARY_PACKAGE_NAME ${library_package})
set(CPACK_DEBIAN_LIBRARY_PACKAGE_SECTION libs)
# CPack would make the shlibs of the Python module as well, which is no library to link.
file(CONFIGURE OUTPUT ${PROJECT_BINARY_DIR}/packaging/shlibs @ONLY CONTENT
  "libwordcatcher @PROJECT_VERSION_MAJOR@ @library_dependency@\n")
set(CPACK_DEBIAN_LIBRARY_PACKAGE_CONTROL_EXTRA
  ${PROJECT_BINARY_DIR}/packaging/shlibs ${packaging}/triggers)
set(CPACK_DEBIAN_LIBRARY_DESCRIPTION "finds stored phrases in free text (shared library)
${about}\
.
This package holds the library.
")
# Libraries whose headers are compiled into what a package holds: their licences go along.
set(CPACK_WORDCATCHER_LIBRARY_CONTAINS nlohmann-json3-dev libxxhash-dev)

# The public headers and the CMake package need nothing but the library.
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_NAME libwordcatcher-dev)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_SECTION libdevel)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_SHLIBDEPS OFF)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_DEPENDS
  "${library_package} (= ${PROJECT_VERSION}-${CPACK_DEBIAN_PACKAGE_RELEASE})")
set(CPACK_DEBIAN_DEVELOPMENT_DESCRIPTION "finds stored phrases in free text (development files)
${about}\
.
This package holds the headers for C++ and C, the CMake package and the
pkg-config file.
")
set(CPACK_WORDCATCHER_DEVELOPMENT_CONTAINS "")

set(CPACK_DEBIAN_COMMAND_PACKAGE_NAME wordcatcher)
set(CPACK_DEBIAN_COMMAND_PACKAGE_SECTION text)
set(CPACK_DEBIAN_COMMAND_PACKAGE_DEPENDS ${library_dependency})
set(CPACK_DEBIAN_COMMAND_DESCRIPTION "finds stored phrases in free text (command)
${about}\
.
This package holds the command wordcatcher, which indexes phrases and finds
them, and verify-metaphone, which checks the encoder of sounds.
")
set(CPACK_WORDCATCHER_COMMAND_CONTAINS libcli11-dev nlohmann-json3-dev libxxhash-dev)

# The module is compiled for one minor version of Python.
if(TARGET wordcatcher-python)
  get_target_property(python_version wordcatcher-python PYTHON_VERSION)
  string(REGEX MATCH "^3\\.([0-9]+)$" minor ${python_version})
  math(EXPR next_minor "${CMAKE_MATCH_1} + 1")
  set(python_dependency "python3 (>= ${python_version}~), python3 (<< 3.${next_minor})")
endif()
set(CPACK_DEBIAN_PYTHON_PACKAGE_NAME python3-wordcatcher)
set(CPACK_DEBIAN_PYTHON_PACKAGE_SECTION python)
set(CPACK_DEBIAN_PYTHON_PACKAGE_DEPENDS "${library_dependency}, ${python_dependency}")
set(CPACK_DEBIAN_PYTHON_PACKAGE_CONTROL_EXTRA
  ${packaging}/python/postinst ${packaging}/python/prerm)
set(CPACK_DEBIAN_PYTHON_DESCRIPTION "finds stored phrases in free text (Python module)
${about}\
.
This package holds the module wordcatcher for Python 3.
")
set(CPACK_WORDCATCHER_PYTHON_CONTAINS pybind11-dev)

include(CPack)
