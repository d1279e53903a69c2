// SPDX-License-Identifier: MIT
// The settings in the general form.

#include "fuzz.h"
#include "support/model.h"
#include "support/state.h"
#include "wifi_info/basic_settings.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    std::string text = input_text(data, size);
    fresh_state();
    add_interface("wlan0");
    model::basic expected = model::read_basic_advanced(text, "wlan0", basic_settings());
    FILE *stream = open_input(text);
    read_basic_settings_advanced(stream);
    fclose(stream);
    CHECK(basic_settings() == expected);
    return 0;
}
