#include "window/activation.h"
