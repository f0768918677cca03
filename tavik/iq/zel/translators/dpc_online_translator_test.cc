#include "tavik/iq/zel/translators/dpc_online_translator.h"
