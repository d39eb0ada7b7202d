#include "qx/types.h"
