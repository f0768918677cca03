#include "tavik/iq/zel/translators/hqdns_online_translator.h"
