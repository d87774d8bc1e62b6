// Formats call arguments for the journal: Args(1, "a", nullptr) -> 1, "a", null
#ifndef SIMCLIENT_ARGS_H
#define SIMCLIENT_ARGS_H

#include <sstream>
#include <string>
#include <type_traits>

#include <steam/steam_api.h>

namespace simclient {

inline void AppendArg(std::ostringstream& out, const char* s)
{
    if (s)
        out << '"' << s << '"';
    else
        out << "null";
}
// Non-const char* is an output buffer whose contents are not text yet.
inline void AppendArg(std::ostringstream& out, char* s)
{
    out << (s ? "buf" : "null");
}
inline void AppendArg(std::ostringstream& out, bool b)
{
    out << (b ? "true" : "false");
}
inline void AppendArg(std::ostringstream& out, const std::string& s)
{
    AppendArg(out, s.c_str());
}
inline void AppendArg(std::ostringstream& out, const CSteamID& id)
{
    out << id.ConvertToUint64();
}
template <class T> void AppendArg(std::ostringstream& out, const T& v)
{
    if constexpr (std::is_enum_v<T>)
        out << static_cast<long long>(v);
    else if constexpr (std::is_pointer_v<T>)
        out << (v ? "ptr" : "null");
    else
        out << v;
}

template <class... A> std::string Args(const A&... a)
{
    std::ostringstream out;
    const char* sep = "";
    ((out << sep, AppendArg(out, a), sep = ", "), ...);
    return out.str();
}

}  // namespace simclient

#endif  // SIMCLIENT_ARGS_H
