#include "settings/wlan_dialog.h"

void cb_wifi_settings(GtkWidget *, gpointer)
{
}
