#include "host/HostServices.h"

HostServices* hostServices = nullptr;
