#include "base/network_list.h"
