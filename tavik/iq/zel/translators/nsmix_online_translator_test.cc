#include "tavik/iq/zel/translators/nsmix_online_translator.h"
