# The production build: the module against the platform's own SDK, whose headers and
# import library a developer points at. Nothing of the stand-ins is built then; the
# platform's runtime (steam_api64.dll) ships beside the module.
if(NOT EXISTS ${STEAMEXT_PLATFORM_SDK_INCLUDE}/steam/steam_api.h)
  message(FATAL_ERROR "STEAMEXT_PLATFORM_SDK_INCLUDE=${STEAMEXT_PLATFORM_SDK_INCLUDE}: no steam/steam_api.h there")
endif()
if(NOT EXISTS ${STEAMEXT_PLATFORM_SDK_LIBRARY})
  message(FATAL_ERROR "STEAMEXT_PLATFORM_SDK_LIBRARY=${STEAMEXT_PLATFORM_SDK_LIBRARY}: no such import library")
endif()

add_library(steam_sdk INTERFACE)
target_include_directories(steam_sdk SYSTEM INTERFACE ${STEAMEXT_PLATFORM_SDK_INCLUDE})
add_library(steam_api UNKNOWN IMPORTED)
set_target_properties(steam_api PROPERTIES IMPORTED_LOCATION ${STEAMEXT_PLATFORM_SDK_LIBRARY})
