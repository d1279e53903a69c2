// The form that adding a preferred network and editing one share, and its toggle handlers.

#ifndef WIFI_PREFERRED_NETWORK_FORM_H
#define WIFI_PREFERRED_NETWORK_FORM_H

#include <gtk/gtk.h>

#endif
