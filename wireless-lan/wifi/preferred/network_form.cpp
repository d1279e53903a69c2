#include "preferred/network_form.h"
