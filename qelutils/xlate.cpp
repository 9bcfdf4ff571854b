#include "qelutils/xlate.h"
