#include "tavik/iq/zel/translators/prc_online_translator.h"
