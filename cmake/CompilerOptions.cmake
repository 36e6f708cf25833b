# Warnings and sanitizers for every target of this project, and for nothing that a host builds.
add_library(wordcatcher_options INTERFACE)
target_compile_options(wordcatcher_options INTERFACE -Wall -Wextra -Wpedantic)
if(WORDCATCHER_WERROR)
  target_compile_options(wordcatcher_options INTERFACE -Werror)
endif()

if(WORDCATCHER_SANITIZE)
  # What is reported needs lines, and no more; much of the time of building goes into the rest, and
  # into optimising what the sanitizers add.
  add_compile_options(-fsanitize=${WORDCATCHER_SANITIZE} -fno-omit-frame-pointer -O1 -g1)
  add_link_options(-fsanitize=${WORDCATCHER_SANITIZE})
  if(WORDCATCHER_SANITIZE MATCHES "undefined")
    add_compile_options(-fno-sanitize-recover=undefined)
  endif()
endif()
