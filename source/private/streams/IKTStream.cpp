// IKTStream.cpp: what the three interfaces of the streams have in common: nothing but being created and destroyed.

#include "IKTStream.h"
#include "IKTReadWriteStream.h"
#include "IKTXferBytes.h"

IKTXferBytes::IKTXferBytes() = default;
IKTXferBytes::IKTXferBytes(IKTXferBytes const &) = default;
IKTXferBytes &IKTXferBytes::operator=(IKTXferBytes const &) = default;
IKTXferBytes::~IKTXferBytes() = default;

IKTStream::IKTStream() = default;
IKTStream::IKTStream(IKTStream const &) = default;
IKTStream &IKTStream::operator=(IKTStream const &) = default;
IKTStream::~IKTStream() = default;

IKTReadWriteStream::IKTReadWriteStream() = default;
IKTReadWriteStream::IKTReadWriteStream(IKTReadWriteStream const &) = default;
IKTReadWriteStream &IKTReadWriteStream::operator=(IKTReadWriteStream const &) = default;
IKTReadWriteStream::~IKTReadWriteStream() = default;
