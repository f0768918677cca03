#include "tavik/iq/zel/translators/skind_online_translator.h"
