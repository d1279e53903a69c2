#include "preferred/list_dialog.h"

void cb_preferred_network_setting(GtkWidget *, gpointer)
{
}
