#include "TCommUtil.h"
