// SPDX-License-Identifier: MIT
// A variable from a file: the first line is its name, the rest is the file. The whole input also
// serves as a parameter line.

#include <algorithm>

#include "fuzz.h"
#include "support/model.h"
#include "wifi_info/basic_settings.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    std::string text = input_text(data, size);
    std::string var = text.substr(0, text.find('\n'));
    std::string content = text.substr(std::min(var.size() + 1, text.size()));
    var = var.c_str();
    bool found;
    std::string expected = model::file_var(content, var, &found);
    g_autofree gchar *value = get_file_var(write_scratch(content).c_str(), var.c_str());
    CHECK((value != nullptr) == found);
    CHECK(!value || value == expected);

    g_autofree gchar *source = g_strdup(text.c_str());
    g_autofree gchar *ret = static_cast<gchar *>(g_malloc(128));
    get_paramval(source, source, ret);
    CHECK(ret == model::second_word(text.c_str(), 128));
    return 0;
}
