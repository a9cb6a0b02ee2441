#include "TOSSpecific.h"
