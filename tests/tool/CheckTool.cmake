# cmake -DZOR=<tool> -DDATA=<data dir> -DOUT=<dir> -P CheckTool.cmake
# The tool on a user's files: what works writes what it says, and each
# failure is one line on stderr that names the file or the export and the
# problem (statuses by name), with a non-zero exit.
file(REMOVE_RECURSE ${OUT})
file(MAKE_DIRECTORY ${OUT})
file(WRITE ${OUT}/short.pgm "P5\n4 4\n255\nab")
file(WRITE ${OUT}/empty.pgm "P5\n0 5\n255\n")
file(WRITE ${OUT}/wide.pgm "P5\n2 1\n65535\nabcd")
file(WRITE ${OUT}/notes.txt "hello\n")

# zor arguments (comma-separated) | exit status | regex the single line of stderr must match
set(cases
  "identify,${OUT}/none.png|1|none.png: cannot open \\(No such file"
  "identify,${OUT}/notes.txt|1|notes.txt: unsupported format"
  "identify,${OUT}/short.pgm|1|short.pgm: truncated: 16 bytes of samples expected, 2 found"
  "identify,${OUT}/empty.pgm|1|empty.pgm: bad size 0 x 5"
  "identify,${OUT}/wide.pgm|1|wide.pgm: maxval 65535 is not supported"
  "mfcc,${DATA}/chelsea.png,${OUT}/x.csv|1|chelsea.png: not a WAV file"
  "edges,${DATA}/chelsea.png,${OUT}/x.png,--low,200,--high,100|1|zoriCanny_16s8u_C1R failed: StatusBadArgument \\(-5\\)"
  "filter,${DATA}/chelsea.png,${OUT}/x.png,--op,median,--size,4|1|median size must be odd"
  "filter,${DATA}/chelsea.png,${OUT}/x.png|1|--op is required"
  "color,${DATA}/chelsea.png,${OUT}/x.ppm,--to,grey|1|x.ppm: PPM holds 3 channels, the image has 1"
  "edges,${DATA}/chelsea.png|1|expected 2 file names, got 1"
  "resize,${DATA}/chelsea.png,${OUT}/x.png,--scale,0.5,--interp,bicubic|1|--interp: unknown mode 'bicubic'"
  "color,${DATA}/chelsea.png,${OUT}/x.png,--to,lab|1|--to: unknown space 'lab'"
  "frobnicate|2|unknown command 'frobnicate'")
foreach(c IN LISTS cases)
  string(REPLACE "|" ";" fields "${c}")
  list(GET fields 0 args)
  list(GET fields 1 want_rc)
  list(GET fields 2 want)
  string(REPLACE "," ";" args "${args}")
  execute_process(COMMAND ${ZOR} ${args} RESULT_VARIABLE rc OUTPUT_QUIET ERROR_VARIABLE err)
  string(REGEX REPLACE "\n$" "" line "${err}")
  if(NOT rc EQUAL want_rc OR NOT line MATCHES "${want}" OR (rc EQUAL 1 AND line MATCHES "\n"))
    message(FATAL_ERROR "zor ${args}: exit ${rc}, stderr:\n${err}\nwanted exit ${want_rc} and one line matching: ${want}")
  endif()
endforeach()

# What works: PNG, PPM and PGM out, read back; the MFCC table; help.
foreach(c "filter;${DATA}/chelsea.png;${OUT}/sharp.ppm;--op;sharpen"
          "filter;${DATA}/chelsea.png;${OUT}/dilated.png;--op;dilate;--size;5"
          "edges;${DATA}/chelsea.png;${OUT}/edges.pgm;--mask;5"
          "color;${DATA}/chelsea.png;${OUT}/grey.png;--to;grey"
          "mfcc;${DATA}/speech.wav;${OUT}/mfcc.csv;--ceps;12"
          "resize;${DATA}/chelsea.png;${OUT}/small.png;--width;100;--interp;super"
          "color;${DATA}/chelsea.png;${OUT}/hsv.pgm;--to;hsv"
          "identify;${OUT}/sharp.ppm;${OUT}/dilated.png;${OUT}/edges.pgm;${OUT}/grey.png;${OUT}/hsv-1.pgm"
          "resize;--help" "info")
  execute_process(COMMAND ${ZOR} ${c} RESULT_VARIABLE rc OUTPUT_VARIABLE out ERROR_VARIABLE err)
  if(NOT rc EQUAL 0)
    message(FATAL_ERROR "zor ${c}: exit ${rc}\n${out}${err}")
  endif()
endforeach()
if(NOT out MATCHES "variant [0-4] \\(")
  message(FATAL_ERROR "zor info does not name the variant:\n${out}")
endif()
execute_process(COMMAND ${ZOR} identify ${OUT}/small.png OUTPUT_VARIABLE small)
if(NOT small MATCHES "small.png: 100x67, 3 channels")
  message(FATAL_ERROR "resize --width 100 of a 451 x 300 image: ${small}")
endif()
file(STRINGS ${OUT}/mfcc.csv rows)
list(LENGTH rows frames)
list(GET rows 0 first)
string(REGEX MATCHALL "," commas "${first}")
list(LENGTH commas ncomma)
if(frames LESS 400 OR NOT ncomma EQUAL 11)
  message(FATAL_ERROR "mfcc.csv: ${frames} rows, first: ${first}")
endif()
