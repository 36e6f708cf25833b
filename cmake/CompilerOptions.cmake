# Warnings and sanitizers for every target of this project, and for nothing that a host builds.
add_library(wordcatcher_options INTERFACE)
target_compile_options(wordcatcher_options INTERFACE -Wall -Wextra -Wpedantic)
if(WORDCATCHER_WERROR)
  target_compile_options(wordcatcher_options INTERFACE -Werror)
endif()

if(WORDCATCHER_SANITIZE)
  # A report needs lines alone; what else there is to debug with takes as long as compiling.
  add_compile_options(-fsanitize=${WORDCATCHER_SANITIZE} -fno-omit-frame-pointer -g1)
  add_link_options(-fsanitize=${WORDCATCHER_SANITIZE})
  if(WORDCATCHER_SANITIZE MATCHES "undefined")
    add_compile_options(-fno-sanitize-recover=undefined)
  endif()
endif()
