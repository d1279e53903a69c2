#include "preferred/store.h"

GtkWidget *build_user_cell_clist()
{
    return nullptr;
}
