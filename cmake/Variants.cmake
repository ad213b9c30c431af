# Code variants: every family source is compiled once per variant, with that
# variant's instruction-set flags and -DZOR_VARIANT=k, into namespace zor::vK.
# The x86-64 build has two wide columns more, 5 (AVX2 with FMA, 32-byte
# registers) and 6 (AVX-512 F/BW/DQ/VL, 64-byte registers), compiled only
# for the families listed as wide (zor_add_family(<source> WIDE)); the
# exports they serve have a wide map in the manifest (frame/columns.h).

if(CMAKE_SYSTEM_PROCESSOR MATCHES "^(i.86|x86)$" OR CMAKE_SIZEOF_VOID_P EQUAL 4)
  set(ZOR_32BIT ON)
else()
  set(ZOR_32BIT OFF)
endif()

if(ZOR_32BIT)
  # Everything outside the SIMD variants must run on any i686.  The Windows
  # stack is only 4-byte aligned on entry: let the compiler realign where
  # SIMD spills need it.
  set(ZOR_BASE_FLAGS -march=i686 -mno-sse -mfpmath=387 -mincoming-stack-boundary=2)
  set(ZOR_VARIANT_FLAGS_0 -march=i686 -mno-sse -mfpmath=387)
  set(ZOR_VARIANT_FLAGS_1 -march=i686 -msse -mfpmath=387)
  # In the SSE2 and later variants -march=i686 sets the instruction-set
  # floor only: tuned for the Pentium Pro itself, every unaligned 16-byte
  # load and store would be split into two 8-byte halves (movq/movhps),
  # which cost the float kernels up to a factor of 4; tune for current
  # processors as the x86-64 build does.  The x87 variants keep the i686
  # tuning: tuned for current processors, the compiler copies 64-bit values
  # through the x87 stack, which quiets signalling NaNs.
  set(ZOR_TUNE -mtune=generic)
  set(ZOR_VARIANT_FLAGS_2 -march=i686 ${ZOR_TUNE} -msse2 -mfpmath=sse)
  set(ZOR_VARIANT_FLAGS_3 -march=i686 ${ZOR_TUNE} -msse3 -mfpmath=sse)
  set(ZOR_VARIANT_FLAGS_4 -march=i686 ${ZOR_TUNE} -mssse3 -mfpmath=sse)
else()
  set(ZOR_BASE_FLAGS)
  # x86-64 always has SSE2; the generic variant stays scalar by convention
  # (no intrinsics) and by flags (no auto-vectorisation).
  set(ZOR_VARIANT_FLAGS_0 -mno-sse3 -mno-ssse3 -fno-tree-vectorize -fno-tree-slp-vectorize)
  set(ZOR_VARIANT_FLAGS_1 -mno-sse3 -mno-ssse3)
  set(ZOR_VARIANT_FLAGS_2 -mno-sse3 -mno-ssse3)
  set(ZOR_VARIANT_FLAGS_3 -msse3 -mno-ssse3)
  set(ZOR_VARIANT_FLAGS_4 -mssse3)
  set(ZOR_VARIANT_FLAGS_5 -mavx2 -mfma)
  set(ZOR_VARIANT_FLAGS_6 -mavx2 -mfma -mavx512f -mavx512bw -mavx512dq -mavx512vl)
endif()
# The highest column this build has.
if(ZOR_32BIT)
  set(ZOR_LAST_VARIANT 4)
else()
  set(ZOR_LAST_VARIANT 6)
endif()

# A fused multiply-add rounds once where the source rounds twice: never let
# the compiler contract (the wide columns have the instruction).
add_compile_options(${ZOR_BASE_FLAGS} -ffp-contract=off)


# zor_add_family(<source> [WIDE]): compile <source> once per variant, and
# for the wide columns too where WIDE is given and the build has them.
function(zor_add_family src)
  string(REGEX REPLACE "[/.-]" "_" base "${src}")
  set(last 4)
  if("WIDE" IN_LIST ARGN)
    set(last ${ZOR_LAST_VARIANT})
  endif()
  foreach(k RANGE 0 ${last})
    set(t zf_${base}_v${k})
    add_library(${t} OBJECT ${src})
    target_include_directories(${t} PRIVATE ${CMAKE_SOURCE_DIR}/include ${CMAKE_SOURCE_DIR})
    target_compile_definitions(${t} PRIVATE ZOR_VARIANT=${k})
    target_compile_options(${t} PRIVATE ${ZOR_VARIANT_FLAGS_${k}})
    set_property(GLOBAL APPEND PROPERTY ZOR_FAMILY_OBJECTS $<TARGET_OBJECTS:${t}>)
    set_property(GLOBAL APPEND PROPERTY ZOR_VARIANT_OBJECTS_${k} "$<JOIN:$<TARGET_OBJECTS:${t}>,\n>")
  endforeach()
endfunction()

# Writes generated/variant<k>.objects: the object files of variant k, one a
# line, for the isolation check.
function(zor_write_variant_object_lists dir)
  foreach(k RANGE 0 ${ZOR_LAST_VARIANT})
    get_property(objs GLOBAL PROPERTY ZOR_VARIANT_OBJECTS_${k})
    list(JOIN objs "\n" content)
    file(GENERATE OUTPUT ${dir}/variant${k}.objects CONTENT "${content}\n")
  endforeach()
endfunction()
