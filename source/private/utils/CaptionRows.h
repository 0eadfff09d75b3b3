// CaptionRows.h: what KTClosedCaptionFileReader.h describes, read from a stream.

#pragma once

#include "IKTStream.h"
#include "KTString.h"

#include <vector>

/// The rows of the stream. One that is null, not ready, or that fails on the way is reported and gives no rows. Throws
/// std::bad_alloc. Any thread.
std::vector<std::vector<KTString>> ReadCaptionRows(IKTStream *stream, unsigned int splitMode);
