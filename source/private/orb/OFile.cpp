// OFile.cpp: the named file-system object.

#include "OFile.h"

#include <utility>

OFile::OFile(OPath path) : m_Path(std::move(path)) {}
