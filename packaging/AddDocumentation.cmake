# Puts the changelog and the copyright file into the packages, and compresses the man pages, all as
# Debian has them. CPack runs it once the files of each component are in a directory of their own.
cmake_policy(VERSION 3.25)

function(compress file)
  execute_process(COMMAND gzip -9nf ${file} COMMAND_ERROR_IS_FATAL ANY)
endfunction()

function(write_copyright file contained)
  file(READ ${CPACK_WORDCATCHER_PACKAGING}/copyright text)
  foreach(library IN LISTS contained)
    file(READ /usr/share/doc/${library}/copyright licence)
    string(APPEND text "\n\nThis package contains code of ${library}, whose copyright file says:\n\n"
      "${licence}")
  endforeach()
  file(WRITE ${file} "${text}")
endfunction()

foreach(component IN LISTS CPACK_COMPONENTS_ALL)
  string(TOUPPER ${component} name)
  set(share ${CPACK_TEMPORARY_DIRECTORY}/${component}/usr/share)
  set(doc ${share}/doc/${CPACK_DEBIAN_${name}_PACKAGE_NAME})

  file(GLOB_RECURSE pages ${share}/man/*)
  foreach(page IN LISTS pages)
    compress(${page})
  endforeach()

  write_copyright(${doc}/copyright "${CPACK_WORDCATCHER_${name}_CONTAINS}")
  configure_file(${CPACK_WORDCATCHER_PACKAGING}/changelog ${doc}/changelog.Debian
    COPYONLY NO_SOURCE_PERMISSIONS)
  compress(${doc}/changelog.Debian)
endforeach()
