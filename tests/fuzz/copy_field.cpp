// SPDX-License-Identifier: MIT
// Copies a text to a field of the size that the first byte gives, then once more from inside the
// field.

#include "fuzz.h"
#include "support/model.h"
#include "wifi_info/text.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    if (size < 2)
        return 0;
    gsize field_size = data[0] % 160 + 1u;
    std::string text = input_text(data + 2, size - 2).c_str();
    std::string expected = model::cut(text, field_size);
    g_autofree char *field = static_cast<char *>(g_malloc(field_size));
    copy_field(field, field_size, text.c_str());
    CHECK(field == expected);
    gsize offset = data[1] % (expected.size() + 1);
    copy_field(field, field_size, field + offset);
    CHECK(field == expected.substr(offset));
    return 0;
}
