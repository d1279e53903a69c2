#include "wifi_info/encryption.h"

#include "wifi.h"

const char *encryption_word(t_encmode encmode)
{
    switch (encmode) {
    case ENC_OFF:
        return "off";
    case ENC_OPEN:
        return "open";
    case ENC_RESTRICTED:
        break;
    }
    return "restricted";
}
