// SPDX-License-Identifier: MIT
// The file of the preferred networks: read, written and read again.

#include "wifi_info/preferred_file.h"
#include "fuzz.h"
#include "support/model.h"
#include "support/state.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    std::string text = input_text(data, size);
    fresh_state();
    FILE *stream = open_input(text);
    read_preferred_networks(stream);
    fclose(stream);
    CHECK(preferred_networks() == model::read_preferred(text));

    std::string written = model::write_preferred(preferred_networks());
    CHECK(save_preferred_network_to_file(scratch_path().c_str()));
    CHECK(read_scratch() == written);
    get_preferred_network_setting_from_file(scratch_path().c_str());
    CHECK(preferred_networks() == model::read_preferred(written));
    return 0;
}
