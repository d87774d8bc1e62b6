// The SDK's callback object, with a look at its registered bit, which the
// module tests before unregistering (the SDK keeps the bit protected).
#pragma once

#include <steam/steam_api.h>

template <class T, class P> class SteamCallback : public CCallback<T, P, false> {
public:
    using typename CCallback<T, P, false>::func_t;
    SteamCallback(T* object, func_t function) : CCallback<T, P, false>(object, function) {}

    bool IsRegistered() const
    {
        return (this->m_nCallbackFlags & CCallbackBase::k_ECallbackFlagsRegistered) != 0;
    }
};
