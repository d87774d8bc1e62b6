// Turns a posted 72-byte event into the journal's decoded copy.
#pragma once

#include "host/HostEvent.h"
#include "simengine/Journal.h"

namespace simengine {

class MemoryTracker;

// Texts and score rows are copied out now, since the module may reuse its
// storage once PostEvent returns. Pointers into Allocate blocks are read no
// further than their block; overruns are journaled as faults.
PostedEvent DecodeEvent(const HostEvent& event, const MemoryTracker& memory, Journal& journal);

}  // namespace simengine
