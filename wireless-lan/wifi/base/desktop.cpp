#include "base/desktop.h"
