#include "preferred/properties_dialog.h"
