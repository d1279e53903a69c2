// SPDX-License-Identifier: MIT
// Text in command lines: a shell must read it as one word with the same content.

#include "wifi_info/shell.h"
#include "fuzz.h"
#include "support/model.h"

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    std::string text = input_text(data, size).c_str();
    g_autofree gchar *escaped = shell_escape(text.c_str());
    std::vector<std::string> words;
    std::string file;
    CHECK(model::shell_words(std::string("iwset \"") + escaped + "\"", &words, &file));
    CHECK(words == std::vector<std::string>({"iwset", text}) && file.empty());

    g_autofree gchar *command = echo_command(text.c_str(), "/tmp/essid_tmp");
    words.clear();
    CHECK(model::shell_words(command, &words, &file));
    CHECK(file == "/tmp/essid_tmp" && words.back() == text);
    words.pop_back();
    if (text[0] == '-' || text.find('\\') != std::string::npos)
        CHECK(words == std::vector<std::string>({"printf", "%s\\n"}));
    else
        CHECK(words == std::vector<std::string>({"echo"}));
    interface_usable(text.c_str(), "nothing");
    return 0;
}
