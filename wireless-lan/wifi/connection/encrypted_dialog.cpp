#include "connection/encrypted_dialog.h"
