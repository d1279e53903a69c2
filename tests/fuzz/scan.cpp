// SPDX-License-Identifier: MIT
// The output of iwlist, read twice: the second scan frees the records of the first.

#include "wifi_info/scan.h"
#include "fuzz.h"
#include "support/model.h"
#include "support/state.h"
#include "wifi.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    std::string text = input_text(data, size);
    std::vector<model::cell> expected = model::read_cells(text);
    fresh_state();
    for (int scan = 0; scan < 2; scan++) {
        FILE *stream = open_input(text);
        read_cells(stream);
        fclose(stream);
        CHECK(scanned_cells() == expected);
        for (int i = 0; i < MAX_CELLS; i++)
            CHECK((my_wifi->wifi_cell[i] != nullptr) == (i < my_wifi->cell_count));
        for (int i = 0; i < my_wifi->cell_count; i++)
            CHECK(my_wifi->wifi_cell[i]->linkstate == 2 && my_wifi->wifi_cell[i]->state[0]);
    }
    return 0;
}
