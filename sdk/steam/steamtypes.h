// Fixed-width scalar types and the handle typedefs shared by every interface header.
#ifndef STEAMTYPES_H
#define STEAMTYPES_H

#include <stddef.h>

typedef unsigned char uint8;
typedef signed char int8;
typedef short int16;
typedef unsigned short uint16;
typedef int int32;
typedef unsigned int uint32;
typedef long long int64;
typedef unsigned long long uint64;

typedef int64 lint64;
typedef uint64 ulint64;
typedef size_t uintp;
typedef ptrdiff_t intp;

typedef uint32 AppId_t;
const AppId_t k_uAppIdInvalid = 0x0;

typedef uint32 DepotId_t;
const DepotId_t k_uDepotIdInvalid = 0x0;

typedef uint32 RTime32;
typedef uint32 AccountID_t;

typedef uint64 SteamAPICall_t;
const SteamAPICall_t k_uAPICallInvalid = 0x0;

typedef int32 HSteamPipe;
typedef int32 HSteamUser;

#endif  // STEAMTYPES_H
