// The engine's string commands: player id, server clock, language, branch,
// the store page, and the "GameCenter" achievement and statistics vocabulary.
//
// Results are static buffers or constant texts that the caller never frees.
#pragma once

const char* DispatchCommand(const char* name, const char* argument);
