# The tools and tests use two header-only libraries, CLI11 and nlohmann-json. A native
# build finds Debian's packages. A cross build uses the same headers, which don't depend
# on the target, through a folder that holds only them: the host's /usr/include must
# stay out of a Windows compile.
if(NOT CMAKE_CROSSCOMPILING)
  find_package(CLI11 CONFIG REQUIRED)
  find_package(nlohmann_json 3 REQUIRED)
  return()
endif()

set(host_headers ${CMAKE_BINARY_DIR}/host-headers)
foreach(library nlohmann_json CLI11)
  if(library STREQUAL nlohmann_json)
    set(header nlohmann/json.hpp)
  else()
    set(header CLI/CLI.hpp)
  endif()
  find_path(${library}_HOST_INCLUDE ${header} PATHS /usr/include NO_CMAKE_FIND_ROOT_PATH NO_DEFAULT_PATH)
  if(NOT ${library}_HOST_INCLUDE)
    message(FATAL_ERROR "${library}: ${header} not found under /usr/include (scripts/setup.sh installs it)")
  endif()
  get_filename_component(folder ${header} DIRECTORY)
  file(MAKE_DIRECTORY ${host_headers})
  file(CREATE_LINK ${${library}_HOST_INCLUDE}/${folder} ${host_headers}/${folder} SYMBOLIC)
  add_library(${library}::${library} INTERFACE IMPORTED GLOBAL)
  target_include_directories(${library}::${library} SYSTEM INTERFACE ${host_headers})
endforeach()
