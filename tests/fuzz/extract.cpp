// SPDX-License-Identifier: MIT
// The two value extractors. The first byte chooses `unit`, the first line is the keyword.

#include "fuzz.h"
#include "support/model.h"
#include "wifi_info/scan.h"

static void check(const std::string &line, const std::string &keyword, bool unit,
                  const std::string &separator,
                  gchar *(*extract)(gchar *src, const gchar *target, int unit))
{
    g_autofree gchar *src = g_strdup(line.c_str());
    g_autofree gchar *value = extract(src, keyword.c_str(), unit);
    size_t at = line.find(keyword);
    std::string after =
        at == std::string::npos ? "" : model::trim(line.substr(at + keyword.size()));
    CHECK((value != nullptr) == !after.empty());
    if (!value)
        return;
    std::vector<std::string> pieces = model::split(after, separator);
    CHECK(value == (unit && pieces.size() > 1 ? pieces[0] + " " + pieces[1] : pieces[0]));
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t *data, size_t size)
{
    if (size == 0)
        return 0;
    std::string text = input_text(data + 1, size - 1).c_str();
    std::string keyword = text.substr(0, text.find('\n'));
    std::string line = text.substr(keyword.size());
    check(line, keyword, data[0] & 1, " ", get_string_value);
    check(line, keyword, data[0] & 1, "        ", get_essid_value);
    return 0;
}
