#include "tavik/iq/zel/translators/sensor_gamma_online_translator.h"
