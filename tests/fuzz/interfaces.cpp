// SPDX-License-Identifier: MIT
// The kernel's list of wireless interfaces.

#include "wifi_info/interfaces.h"
#include "fuzz.h"
#include "support/model.h"
#include "support/state.h"
#include "wifi.h"
#include "wifi_info/shell.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    std::string text = input_text(data, size);
    model::interfaces expected = model::read_interfaces(text);
    fresh_state();
    FILE *stream = open_input(text);
    read_interfaces(stream);
    fclose(stream);
    CHECK(my_wifi->interface_count == expected.count && my_wifi->interface_index == 0);
    for (size_t i = 0; i < MAX_INTERFACES; i++) {
        WIFI_INTERFACE *iface = my_wifi->wifi_interface[i];
        CHECK((iface != nullptr) == (i < expected.names.size()));
        CHECK(!iface || FIELD(*iface, name) == expected.names[i]);
        if (iface)
            interface_usable(iface->name, "nothing");
    }
    return 0;
}
