# Turns a strings table into a C++ source that holds its text, so that the library carries
# the table and nothing has to be found on disk at run time. Parsing happens in C++
# (TQStrings.cpp), where the tests can reach it.
#
# cmake -DINPUT=<table.strings> -DOUTPUT=<file.cpp> -DFUNCTION=<name> -P EmbedStrings.cmake

foreach(var INPUT OUTPUT FUNCTION)
  if(NOT DEFINED ${var})
    message(FATAL_ERROR "EmbedStrings: ${var} is not set")
  endif()
endforeach()

file(READ "${INPUT}" content)
set(delimiter "vce_strings")
string(FIND "${content}" ")${delimiter}\"" clash)
if(NOT clash EQUAL -1)
  message(FATAL_ERROR "EmbedStrings: ${INPUT} contains the raw-string delimiter )${delimiter}\"")
endif()

get_filename_component(name "${INPUT}" NAME)
set(source "// Generated from ${name} at build time; edit the table, not this file.\n")
string(APPEND source "#include <string_view>\n\n")
string(APPEND source "std::string_view ${FUNCTION}() {\n")
string(APPEND source "    static constexpr std::string_view kText = R\"${delimiter}(${content})${delimiter}\";\n")
string(APPEND source "    return kText;\n}\n")

file(WRITE "${OUTPUT}" "${source}")
