#include "tavik/iq/zel/translators/edgedet_online_translator.h"
