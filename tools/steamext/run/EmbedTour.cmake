# Writes the built-in tour's source: the text of scenarios/tour.json as one
# raw string, so the program and the file never differ.
#   cmake -DINPUT=scenarios/tour.json -DOUTPUT=TourScenario.cpp -P EmbedTour.cmake
file(READ ${INPUT} tour)
string(FIND "${tour}" ")tour\"" clash)
if(NOT clash EQUAL -1)
  message(FATAL_ERROR "${INPUT} holds the text )tour\" which ends the embedded string early")
endif()
file(WRITE ${OUTPUT} "// Generated from scenarios/tour.json at build time; edit that file instead.\n"
  "#include \"run/ScenarioParser.h\"\n\n"
  "namespace steamext::run {\n\n"
  "const char* const kBuiltinTour = R\"tour(${tour})tour\";\n\n"
  "}  // namespace steamext::run\n")
