# CPack makes a postinst and a postrm that call ldconfig for whatever has a shared object below a
# directory of libraries, and offers no way to say no. The trigger does it once for all packages of an
# installation, so they are taken out again.
cmake_policy(VERSION 3.25)

foreach(package IN LISTS CPACK_PACKAGE_FILES)
  set(unpacked ${CPACK_TEMPORARY_DIRECTORY}/unpacked)
  file(REMOVE_RECURSE ${unpacked})
  execute_process(COMMAND dpkg-deb -R ${package} ${unpacked} COMMAND_ERROR_IS_FATAL ANY)
  set(calls 0)
  foreach(script IN ITEMS postinst postrm)
    set(script ${unpacked}/DEBIAN/${script})
    if(EXISTS ${script})
      file(STRINGS ${script} call REGEX "^[ \t]*ldconfig$")
      if(call)
        file(REMOVE ${script})
        math(EXPR calls "${calls} + 1")
      endif()
    endif()
  endforeach()
  if(calls)
    execute_process(COMMAND dpkg-deb -Zxz --root-owner-group -b ${unpacked} ${package}
      OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)
  endif()
endforeach()
