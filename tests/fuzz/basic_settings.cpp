// SPDX-License-Identifier: MIT
// The settings file: read into a record with the flags that the first byte gives, written, and read
// again.

#include "wifi_info/basic_settings.h"
#include "fuzz.h"
#include "support/model.h"
#include "support/state.h"
#include "wifi.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    if (size == 0)
        return 0;
    std::string text = input_text(data + 1, size - 1);
    fresh_state();
    WIFI_INTERFACE *iface = add_interface("wlan0");
    iface->isstatic = data[0] & 1;
    iface->isdhcp = data[0] >> 1 & 1;
    iface->auto_dns = data[0] >> 2 & 1;
    model::basic expected = model::read_basic(text, "wlan0", basic_settings());
    FILE *stream = open_input(text);
    read_basic_settings(stream);
    fclose(stream);
    CHECK(basic_settings() == expected);

    std::string written = model::write_basic("wlan0", expected);
    CHECK(save_basic_setting_to_file(scratch_path().c_str()));
    CHECK(read_scratch() == written);
    expected = model::read_basic(written, "wlan0", expected);
    get_basic_setting_from_file(scratch_path().c_str());
    CHECK(basic_settings() == expected);
    return 0;
}
