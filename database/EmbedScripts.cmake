# Writes the scripts as string constants into one source: cmake -DOUTPUT=... -DSOURCE_DIR=... -P EmbedScripts.cmake
# A literal may hold no more than 64 KB; the longest script has a quarter of it.
set(source "#include \"database/Scripts.h\"\n\nnamespace QVSa::database {\n\n")
foreach(pair qvSys:QVSys qvApp:QVApp qvUpdate:QVUpdate qvSys2:QVSys.2)
  string(REPLACE ":" ";" pair ${pair})
  list(GET pair 0 constant)
  list(GET pair 1 file)
  file(READ ${SOURCE_DIR}/${file}.sql script)
  string(APPEND source "const std::string_view ${constant} = R\"script(${script})script\";\n\n")
endforeach()
string(APPEND source "}  // namespace QVSa::database\n")
file(WRITE ${OUTPUT} "${source}")
