#include "TCIMValue.h"
