# Writes a source file that holds files byte for byte. Run as a script, with
#   OUTPUT   the source file
#   HEADER   the header that declares the functions
#   FILES    Function=path, separated by commas: each becomes `std::string_view Function()`
#   FOLDERS  Function=folder, separated by commas: each becomes `std::span<const EmbeddedFile> Function()`, the files
#            in the folder by their names
file(WRITE ${OUTPUT}.part "#include \"${HEADER}\"\n")

# Appends the bytes of the file as the array `${name}Bytes`.
function(append_bytes name path)
  file(READ ${path} bytes HEX)
  string(REGEX REPLACE "(................................)" "\\1\n    " bytes "${bytes}")
  string(REGEX REPLACE "([0-9a-f][0-9a-f])" "0x\\1," bytes "${bytes}")
  file(APPEND ${OUTPUT}.part "
namespace {
constexpr unsigned char ${name}Bytes[] = {
    ${bytes}
};
} // namespace
")
endfunction()

string(REPLACE "," ";" FILES "${FILES}")
string(REPLACE "," ";" FOLDERS "${FOLDERS}")
foreach(entry IN LISTS FILES)
  string(REGEX MATCH "^([^=]+)=(.*)$" matched "${entry}")
  set(function ${CMAKE_MATCH_1})
  append_bytes(${function} ${CMAKE_MATCH_2})
  file(APPEND ${OUTPUT}.part "
std::string_view ${function}() { return {reinterpret_cast<const char*>(${function}Bytes), sizeof ${function}Bytes}; }
")
endforeach()
foreach(entry IN LISTS FOLDERS)
  string(REGEX MATCH "^([^=]+)=(.*)$" matched "${entry}")
  set(function ${CMAKE_MATCH_1})
  set(folder ${CMAKE_MATCH_2})
  file(GLOB names RELATIVE ${folder} ${folder}/*)
  set(entries "")
  set(number 0)
  foreach(name IN LISTS names)
    append_bytes(${function}${number} ${folder}/${name})
    set(bytes "${function}${number}Bytes")
    string(APPEND entries "\n        {\"${name}\", {reinterpret_cast<const char*>(${bytes}), sizeof ${bytes}}},")
    math(EXPR number "${number} + 1")
  endforeach()
  file(APPEND ${OUTPUT}.part "
std::span<const EmbeddedFile> ${function}() {
    static const EmbeddedFile files[] = {${entries}
    };
    return files;
}
")
endforeach()
file(RENAME ${OUTPUT}.part ${OUTPUT})
