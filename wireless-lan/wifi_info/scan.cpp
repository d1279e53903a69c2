#include "wifi.h"
