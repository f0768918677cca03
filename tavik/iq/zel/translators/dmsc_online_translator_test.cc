#include "tavik/iq/zel/translators/dmsc_online_translator.h"
