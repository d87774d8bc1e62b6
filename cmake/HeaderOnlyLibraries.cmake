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
file(MAKE_DIRECTORY ${host_headers})
# host_header_library(NAME HEADER): the target NAME::NAME, seeing the folder of HEADER.
function(host_header_library name header)
  find_path(${name}_HOST_INCLUDE ${header} PATHS /usr/include NO_CMAKE_FIND_ROOT_PATH NO_DEFAULT_PATH)
  if(NOT ${name}_HOST_INCLUDE)
    message(FATAL_ERROR "${name}: ${header} not found under /usr/include (scripts/setup.sh installs it)")
  endif()
  get_filename_component(folder ${header} DIRECTORY)
  file(CREATE_LINK ${${name}_HOST_INCLUDE}/${folder} ${host_headers}/${folder} SYMBOLIC)
  add_library(${name}::${name} INTERFACE IMPORTED GLOBAL)
  target_include_directories(${name}::${name} SYSTEM INTERFACE ${host_headers})
endfunction()

host_header_library(nlohmann_json nlohmann/json.hpp)
host_header_library(CLI11 CLI/CLI.hpp)
