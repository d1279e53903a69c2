// SPDX-License-Identifier: MIT
// Preloaded with others into an emulated program: the commands that it starts are this machine's
// own, which cannot load them.
#include <stdlib.h>

__attribute__((constructor)) static void keep_from_children(void)
{
    unsetenv("LD_PRELOAD");
}
