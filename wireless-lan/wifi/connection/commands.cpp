#include "connection/commands.h"
