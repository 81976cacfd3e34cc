# Writes a source file that holds files byte for byte. Run as a script, with
#   OUTPUT   the source file
#   HEADER   the header that declares the functions
#   FILES    Function=path, separated by commas: each becomes `std::string_view Function()`
file(WRITE ${OUTPUT}.part "#include \"${HEADER}\"\n")
string(REPLACE "," ";" FILES "${FILES}")
foreach(entry IN LISTS FILES)
  string(REGEX MATCH "^([^=]+)=(.*)$" matched "${entry}")
  set(function ${CMAKE_MATCH_1})
  file(READ ${CMAKE_MATCH_2} bytes HEX)
  string(REGEX REPLACE "(................................)" "\\1\n    " bytes "${bytes}")
  string(REGEX REPLACE "([0-9a-f][0-9a-f])" "0x\\1," bytes "${bytes}")
  file(APPEND ${OUTPUT}.part "
namespace {
constexpr unsigned char ${function}Bytes[] = {
    ${bytes}
};
} // namespace

std::string_view ${function}() { return {reinterpret_cast<const char*>(${function}Bytes), sizeof ${function}Bytes}; }
")
endforeach()
file(RENAME ${OUTPUT}.part ${OUTPUT})
