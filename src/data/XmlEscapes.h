// The two in-place rewrites of an attribute value: backslash escapes, then the
// two known entities.
#pragma once

namespace xml {

// "\n", "\r", "\t", "\"" and "\\" become their bytes; a backslash before anything
// else is dropped with that byte. A backslash at the very end is dropped alone.
void UndoEscapes(char* value);

// Replaces "&quot;" by '"' and "&amp;" by '&', scanning on behind each
// replacement. One pass does what a pass for each would, in that order: neither
// entity can overlap the other, and a '"' put in can't start an "&amp;".
void ReplaceQuotAndAmp(char* value);

}  // namespace xml
