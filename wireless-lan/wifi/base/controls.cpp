// SPDX-License-Identifier: MIT
#include "base/controls.h"

#include "base/registry.h"

static const struct {
    const char *key;
    guint holds; // each of them keeps the control grey
} CONTROLS[] = {
    {PREFERRED_BUTTON, HOLD_CHECK | HOLD_REFRESH | HOLD_CONNECT},
    {CONNECT_BUTTON, HOLD_CHECK | HOLD_REFRESH | HOLD_CONNECT | HOLD_HOST},
    {SETTINGS_BUTTON, HOLD_CHECK | HOLD_REFRESH | HOLD_CONNECT},
    {REFRESH_BUTTON, HOLD_CHECK | HOLD_REFRESH | HOLD_CONNECT | HOLD_HOST},
    {NETWORK_VIEW, HOLD_REFRESH | HOLD_HOST},
};

static guint current = 0; // the holds in force

static void apply_holds()
{
    for (const auto &control : CONTROLS)
        set_widget_sensitive(control.key, (control.holds & current) == 0);
}

void hold_controls(control_hold hold)
{
    current |= hold;
    apply_holds();
}

void release_controls(guint holds)
{
    current &= ~holds;
    apply_holds();
}

gboolean controls_held(guint holds)
{
    return (current & holds) != 0;
}
