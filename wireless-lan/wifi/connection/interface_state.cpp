#include "connection/interface_state.h"
