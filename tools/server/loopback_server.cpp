#include "loopback_server.h"
