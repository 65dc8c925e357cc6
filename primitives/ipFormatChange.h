#pragma once
// Converts pixels between tiles of any two formats.
#include "geRectangle.h"
#include "ixReadGuard.h"
#include "ixWriteGuard.h"

namespace Zr {

// Copies the pixels of from into to, converting each from from's format into to's through float
// RGBA (see IxRowCodec: a missing alpha reads as 1, missing colour as 0; channels the target
// lacks are dropped). No premultiplication is done or undone. Only pixels inside rectangle, from's
// region and to's region are touched; a null rectangle means all of from's region. An empty
// guard on either side converts nothing. The two guards may not hold the same tile in different
// formats (they cannot); on the same tile the call copies each pixel onto itself.
void ipFormatChange(const IxWriteGuard& to, const IxReadGuard& from, const GeRectangle<int>* rectangle);

}  // namespace Zr
