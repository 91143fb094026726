#include <ZT/nowhere.h>
