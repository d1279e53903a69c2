#include "connection/flow.h"

void cb_connect(GtkWidget *, gpointer)
{
}

gboolean cb_view_sel(GtkWidget *, GdkEventButton *, void *)
{
    return FALSE;
}
