#ifndef ZT_COMMON_H
#define ZT_COMMON_H

/// \file
/// What every header of the utility layer starts from: the export mark, the
/// stream names and the classes that most of them mention.
///
/// The utility layer is written on top of the core object layer; code that
/// uses it needs no header of the core layer beside the front doors in ZT/.

#include <KVO/KvoCommon.h>

#include <cstddef>
#include <cstdint>
#include <iosfwd>

class KvoArray;
class KvoClassInfo;
class KvoList;
class KvoNamedObject;
class KvoObjArray;
class KvoObjList;
class KvoObject;
class KvoSkipList;
class KvoStatement;
class KvoTime;
class KvoToken;
class KvoTokenList;
class ZtDirective;
class ZtDirector;
class ZtDispatcher;
class ZtErr;
class ZtErrHandler;

#endif
