#include "connection/add_to_preferred.h"
