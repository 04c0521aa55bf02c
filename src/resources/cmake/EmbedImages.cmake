# Turns the PNG files of a folder into a C++ source that holds their bytes, so that the library
# carries its images and nothing has to be found on disk at run time. Decoding happens in C++
# (BNImage.cpp) at the first request of each file.
#
# cmake -DINPUT_DIR=<folder of *.png> -DOUTPUT=<file.cpp> -P EmbedImages.cmake

foreach(var INPUT_DIR OUTPUT)
  if(NOT DEFINED ${var})
    message(FATAL_ERROR "EmbedImages: ${var} is not set")
  endif()
endforeach()

string(REPEAT "[0-9a-f]" 64 lineOfHex)

file(GLOB files RELATIVE "${INPUT_DIR}" "${INPUT_DIR}/*.png")
list(SORT files)

# Files whose names differ from the resource names the panels ask for: the table lists each
# under its resource name, so the library sees only those.
set(resourceOfFile
  "ChannelRowMenu=S_Inspector_ParameterMenu_Normal"
  "StripReset=Shared_Inspector_Reset"
  "StripBorder=K_Inspector_Gradient-Border")

set(source "// Generated from the images folder at build time; edit the PNG files, not this file.\n")
string(APPEND source "#include \"src/resources/internal/TQEmbeddedImages.h\"\n\n")
string(APPEND source "namespace {\n")
set(table "")
set(index 0)
foreach(name ${files})
  file(READ "${INPUT_DIR}/${name}" hex HEX)
  string(LENGTH "${hex}" hexLength)
  math(EXPR byteCount "${hexLength} / 2")
  if(byteCount EQUAL 0)
    message(FATAL_ERROR "EmbedImages: ${name} is empty")
  endif()
  # 64 hex digits (32 bytes) per line keeps the generated file readable in a debugger.
  string(REGEX REPLACE "(${lineOfHex})" "\\1\n" hex "${hex}")
  string(REGEX REPLACE "([0-9a-f][0-9a-f])" "0x\\1," bytes "${hex}")
  string(APPEND source "// ${name}\nconstexpr unsigned char kImage${index}[] = {\n${bytes}};\n")
  set(resourceFileName "${name}")
  foreach(pair ${resourceOfFile})
    string(REPLACE "=" ";" pair "${pair}")
    list(GET pair 0 fileStem)
    list(GET pair 1 resource)
    if(name MATCHES "^${fileStem}(@2x)?\\.png$")
      set(resourceFileName "${resource}${CMAKE_MATCH_1}.png")
    endif()
  endforeach()
  string(APPEND table "    {\"${resourceFileName}\", kImage${index}, ${byteCount}},\n")
  math(EXPR index "${index} + 1")
endforeach()
string(APPEND source "\nconstexpr TQEmbeddedImageFile kFiles[] = {\n${table}    {nullptr, nullptr, 0},\n};\n")
string(APPEND source "}  // namespace\n\n")
string(APPEND source "std::span<const TQEmbeddedImageFile> TQEmbeddedImageFiles() {\n")
string(APPEND source "    // The last entry only keeps the array non-empty when the folder is.\n")
string(APPEND source "    return {kFiles, std::size(kFiles) - 1};\n}\n")

file(WRITE "${OUTPUT}.tmp" "${source}")
# Only touch the output when it changed, so that an unchanged folder recompiles nothing.
file(COPY_FILE "${OUTPUT}.tmp" "${OUTPUT}" ONLY_IF_DIFFERENT)
file(REMOVE "${OUTPUT}.tmp")
