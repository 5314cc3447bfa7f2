find_package(PkgConfig REQUIRED)
find_package(Threads REQUIRED)
pkg_check_modules(PUGIXML REQUIRED IMPORTED_TARGET pugixml)
# Decides whether a template file is well-formed XML before pugixml builds its tree.
pkg_check_modules(EXPAT REQUIRED IMPORTED_TARGET expat)
# Only tests and benchmarks write workbooks with it, as input a spreadsheet program could have made.
pkg_check_modules(XLSXWRITER REQUIRED IMPORTED_TARGET xlsxwriter)
find_package(GTest REQUIRED)

add_library(velmora_deps INTERFACE)
target_link_libraries(velmora_deps INTERFACE
  PkgConfig::PUGIXML
  PkgConfig::EXPAT
  Threads::Threads ${CMAKE_DL_LIBS})
