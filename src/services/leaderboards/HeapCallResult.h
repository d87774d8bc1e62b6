// A call-result object made and freed on its own, as a queue entry holds it.
// The SDK's class has virtual functions and no virtual destructor, so it is held
// inside a final holder that is freed by its own type.
#pragma once

#include <steam/steam_api.h>

template <class T, class P> struct HeapCallResult final {
    CCallResult<T, P> result;
};
