# cmake -DIN=<exports.s> -DOUT=<dir> [-DEXTENSIONS=<name;...>] -P GenExports.cmake
# Turns the export listing into zor.def (32-bit Windows: undecorated exports,
# decorated import names), zor.map (Linux version script), exports.txt and
# stubs.inc (one "stub <name>, <argument bytes>" line per export, assembled by
# frame/stubs.S).  EXTENSIONS are exported names outside the manifest
# (plain functions, no stub): they join the version script only.
file(STRINGS "${IN}" lines REGEX "#ZOREXPORT ")
set(def "LIBRARY zor.dll\nEXPORTS\n")
set(map "{\n  global:\n")
set(names "")
set(stubs "")
foreach(line IN LISTS lines)
  if(line MATCHES "#ZOREXPORT ([A-Za-z0-9_]+) \\$?([0-9]+)")
    string(APPEND def "  ${CMAKE_MATCH_1}@${CMAKE_MATCH_2}\n")
    string(APPEND map "    ${CMAKE_MATCH_1};\n")
    string(APPEND names "${CMAKE_MATCH_1}\n")
    string(APPEND stubs "stub ${CMAKE_MATCH_1}, ${CMAKE_MATCH_2}\n")
  endif()
endforeach()
foreach(name IN LISTS EXTENSIONS)
  string(APPEND map "    ${name};\n")
endforeach()
string(APPEND map "  local:\n    *;\n};\n")
file(WRITE "${OUT}/zor.def" "${def}")
file(WRITE "${OUT}/zor.map" "${map}")
file(WRITE "${OUT}/exports.txt" "${names}")
file(WRITE "${OUT}/stubs.inc" "${stubs}")
