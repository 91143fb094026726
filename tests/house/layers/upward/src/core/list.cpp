#include <ZT/directive.h>
