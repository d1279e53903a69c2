#include "settings/adhoc_dialog.h"
