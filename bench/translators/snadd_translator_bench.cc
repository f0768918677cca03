#include "tavik/iq/zel/translators/snadd_online_translator.h"
