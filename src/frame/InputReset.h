// Clears the engine's input state, as needed whenever the overlay opens or closes:
// keys and buttons pressed while the overlay had focus must not stick.
#pragma once

void ResetEngineInput();
