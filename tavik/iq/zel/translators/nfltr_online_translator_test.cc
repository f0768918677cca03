#include "tavik/iq/zel/translators/nfltr_online_translator.h"
