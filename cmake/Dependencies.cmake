find_package(PkgConfig REQUIRED)
find_package(Threads REQUIRED)
pkg_check_modules(PUGIXML REQUIRED IMPORTED_TARGET pugixml)
# Only tests and benchmarks write workbooks with it, as input a spreadsheet program could have made.
pkg_check_modules(XLSXWRITER REQUIRED IMPORTED_TARGET xlsxwriter)
pkg_search_module(ORCUS REQUIRED IMPORTED_TARGET liborcus-0.17 liborcus-0.18 liborcus-0.16)
find_package(GTest REQUIRED)

add_library(velmora_deps INTERFACE)
target_link_libraries(velmora_deps INTERFACE
  PkgConfig::PUGIXML PkgConfig::ORCUS
  Threads::Threads ${CMAKE_DL_LIBS})
