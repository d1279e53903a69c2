#include "connection/monitor.h"
