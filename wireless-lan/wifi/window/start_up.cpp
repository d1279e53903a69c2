#include "window/start_up.h"
