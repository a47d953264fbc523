# Writes a C++ source that holds the bytes of a file: cmake -DINPUT=... -DOUTPUT=... -DFUNCTION=... -DHEADER=... -P
# The function is a std::string_view of the header, in namespace inspector.
file(READ "${INPUT}" bytes HEX)
string(REGEX REPLACE "(................................)" "\\1\n" bytes "${bytes}")
string(REGEX REPLACE "([0-9a-f][0-9a-f])" "'\\\\x\\1'," bytes "${bytes}")
file(
  WRITE "${OUTPUT}"
  "#include \"${HEADER}\"\n
namespace inspector {\n
std::string_view ${FUNCTION}() {
static constexpr char text[] = {
${bytes}};
return {text, sizeof text};
}\n
} // namespace inspector\n")
