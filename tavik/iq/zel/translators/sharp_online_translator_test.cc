#include "tavik/iq/zel/translators/sharp_online_translator.h"
