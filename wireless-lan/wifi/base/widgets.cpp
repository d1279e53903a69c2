#include "base/widgets.h"
