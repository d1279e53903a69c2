#include "preferred/add_dialog.h"
