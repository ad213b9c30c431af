# cmake -DOUT=<gallery dir> -DCHROMIUM=<browser> -P CheckRender.cmake
# Renders the gallery that `zor demo` wrote (the demo test) in a headless
# browser: the page marks how many of its images failed to load, and a
# screenshot of its top is left at OUT/screenshot.png.  Without a browser the
# test reports itself skipped (scripts/setup.sh installs Debian's chromium).
if(NOT CHROMIUM OR NOT EXISTS "${CHROMIUM}")
  message("gallery-render skipped: no chromium (scripts/setup.sh installs it)")
  return()
endif()
file(READ ${OUT}/index.html page)
string(REGEX MATCHALL "<img src=" shown "${page}")
list(LENGTH shown n)
file(REMOVE ${OUT}/screenshot.png)
set(flags --headless --no-sandbox --disable-gpu --disable-background-networking --no-first-run
    --disable-component-update --disable-sync --disable-dev-shm-usage --user-data-dir=${OUT}/.browser
    --virtual-time-budget=20000 --hide-scrollbars)
execute_process(COMMAND ${CHROMIUM} ${flags} --dump-dom file://${OUT}/index.html
                RESULT_VARIABLE rc OUTPUT_VARIABLE dom ERROR_VARIABLE err TIMEOUT 60)
if(NOT dom MATCHES "data-images=\"${n}\" data-broken=\"0\"")
  string(REGEX MATCH "<p id=\"check\">[^<]*" said "${dom}")
  message(FATAL_ERROR "the page did not load all ${n} images in ${CHROMIUM} (${rc}): ${said}\n${err}")
endif()
execute_process(COMMAND ${CHROMIUM} ${flags} --window-size=1400,3000 --screenshot=${OUT}/screenshot.png
                file://${OUT}/index.html RESULT_VARIABLE rc OUTPUT_QUIET ERROR_VARIABLE err TIMEOUT 60)
if(NOT EXISTS ${OUT}/screenshot.png)
  message(FATAL_ERROR "no screenshot (${rc}): ${err}")
endif()
file(REMOVE_RECURSE ${OUT}/.browser)
message(STATUS "rendered in ${CHROMIUM}: all ${n} images loaded; screenshot ${OUT}/screenshot.png")
