#include "window/refresh.h"
