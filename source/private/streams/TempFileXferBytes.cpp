// TempFileXferBytes.cpp: the transport over a temporary file.

#include "TempFileXferBytes.h"

namespace {

constexpr unsigned int kTemporaryAttribute = 256; // FILE_ATTRIBUTE_TEMPORARY

} // namespace

TempFileXferBytes::TempFileXferBytes() : FileXferBytes(kTemporaryAttribute) {}

TempFileXferBytes::TempFileXferBytes(TempFileXferBytes const &other) = default;
TempFileXferBytes &TempFileXferBytes::operator=(TempFileXferBytes const &other) = default;
TempFileXferBytes::~TempFileXferBytes() = default;
