# Little CMS, found one way for every target that uses it (the kvdata
# command's CGATS files, the colorimetry benchmarks' peer): its header and
# library by name, as one interface target, kvdata_lcms2. The library itself
# never links it.
include_guard(GLOBAL)

find_path(LCMS2_INCLUDE_DIR lcms2.h REQUIRED)
find_library(LCMS2_LIBRARY lcms2 REQUIRED)
add_library(kvdata_lcms2 INTERFACE)
target_include_directories(kvdata_lcms2 SYSTEM INTERFACE ${LCMS2_INCLUDE_DIR})
target_link_libraries(kvdata_lcms2 INTERFACE ${LCMS2_LIBRARY})
