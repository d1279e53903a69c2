#include "preferred/delete_dialog.h"
