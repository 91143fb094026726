#include "ZT/std_imp.h"

constinit ZtStdImp* ZtStdImp::theImp = nullptr;

ZtStdImp::ZtStdImp()
{
    delete theImp;
    theImp = this;
}

ZtStdImp::~ZtStdImp()
{
    theImp = nullptr;
}
