# Writes the C++ example of the README to a source file. Arguments: README, OUTPUT.
file(READ "${README}" page)
string(REGEX MATCH "```cpp\n([^`]*)```" found "${page}")
if(NOT found)
  message(FATAL_ERROR "the README has no C++ example")
endif()
file(WRITE "${OUTPUT}" "${CMAKE_MATCH_1}")
