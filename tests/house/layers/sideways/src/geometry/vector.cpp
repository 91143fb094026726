#include "image/rows.h"
