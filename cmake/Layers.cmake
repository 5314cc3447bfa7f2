# The layers of the code, one static library each (docs/architecture.md). A layer's sources see the
# headers of its own folders and of the layers it links, nothing else: each layer publishes its
# folders through a staging directory in the build tree that mirrors their source paths with
# symbolic links (build/layers/formats/platform/rbx -> <source>/platform/rbx), so an #include of a
# higher layer's header finds no file and the build fails.
set(VELMORA_LAYER_ROOT ${CMAKE_BINARY_DIR}/layers)

# Links `folder` (relative to the source root) into the staging directory `stage`. A folder whose
# qt/ subfolder belongs to another layer is published header by header, without that subfolder.
function(velmora_stage_folder stage folder)
  set(source ${CMAKE_SOURCE_DIR}/${folder})
  get_filename_component(parent ${stage}/${folder} DIRECTORY)
  file(MAKE_DIRECTORY ${parent})
  if(IS_DIRECTORY ${source}/qt AND NOT folder MATCHES "/qt$")
    file(MAKE_DIRECTORY ${stage}/${folder})
    file(GLOB headers CONFIGURE_DEPENDS ${source}/*.h)
    foreach(header ${headers})
      get_filename_component(name ${header} NAME)
      file(CREATE_LINK ${header} ${stage}/${folder}/${name} SYMBOLIC)
    endforeach()
  elseif(NOT EXISTS ${stage}/${folder})
    file(CREATE_LINK ${source} ${stage}/${folder} SYMBOLIC)
  endif()
endfunction()

# velmora_layer(<name> FOLDERS <folder>... [LINKS <target>...] [ONLY <regex>] [EXCLUDE <regex>])
# Builds the .cpp files of the folders (not of their qt/ subfolders, unless the folder is one)
# into velmora_<name>; ONLY keeps the sources that match, EXCLUDE drops those that match.
function(velmora_layer name)
  cmake_parse_arguments(LAYER "" "ONLY;EXCLUDE" "FOLDERS;LINKS" ${ARGN})
  set(stage ${VELMORA_LAYER_ROOT}/${name})
  set(sources)
  foreach(folder ${LAYER_FOLDERS})
    velmora_stage_folder(${stage} ${folder})
    if(folder MATCHES "/qt$")
      file(GLOB found CONFIGURE_DEPENDS ${CMAKE_SOURCE_DIR}/${folder}/*.cpp)
    else()
      file(GLOB_RECURSE found CONFIGURE_DEPENDS ${CMAKE_SOURCE_DIR}/${folder}/*.cpp)
      list(FILTER found EXCLUDE REGEX "/qt/")
    endif()
    list(APPEND sources ${found})
  endforeach()
  if(LAYER_ONLY)
    list(FILTER sources INCLUDE REGEX "${LAYER_ONLY}")
  endif()
  if(LAYER_EXCLUDE)
    list(FILTER sources EXCLUDE REGEX "${LAYER_EXCLUDE}")
  endif()
  add_library(velmora_${name} STATIC ${sources})
  target_include_directories(velmora_${name} PUBLIC ${stage})
  target_link_libraries(velmora_${name} PUBLIC ${LAYER_LINKS})
  velmora_warnings(velmora_${name})
endfunction()
