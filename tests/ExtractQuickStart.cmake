# Writes the first example of a page in a language to a source file. Arguments: PAGE, LANGUAGE,
# OUTPUT.
file(READ "${PAGE}" page)
string(REGEX MATCH "```${LANGUAGE}\n([^`]*)```" found "${page}")
if(NOT found)
  message(FATAL_ERROR "${PAGE} has no example in ${LANGUAGE}")
endif()
file(WRITE "${OUTPUT}" "${CMAKE_MATCH_1}")
