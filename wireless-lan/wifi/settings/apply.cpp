#include "settings/apply.h"
