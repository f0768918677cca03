#include "tavik/iq/zel/translators/disparity_online_translator.h"
