// OFile.cpp: the named file-system object.

#include "OFile.h"

#include "OCopy.h"
#include "OFileSystem.h"

#include <utility>

OFile::OFile(OPath path) : m_Path(std::move(path)) {}

bool OFile::Exists() const { return OExists(m_Path); }

bool OFile::ParentExists() const {
    OPath const parent = OGetFullPath(m_Path).GetParent();
    OFileFacts facts;
    return !parent.IsEmpty() && OGetFacts(parent, facts) == OError::None && facts.isFolder;
}

bool OFile::Delete() const { return ODelete(m_Path) == OError::None; }

bool OFile::MakeFile(bool replace) const { return OMakeFile(m_Path, replace) == OError::None; }

bool OFile::Touch() const { return OTouch(m_Path) == OError::None; }

bool OFile::ResolveAlias() { return !m_Path.IsEmpty() && OResolveAlias(m_Path) == OError::None; }

bool OFile::CanOpen(AccessMode access, ShareMode share) const {
    return OTryOpen(m_Path, access, share) == OError::None;
}

KTUInt64 OFile::GetSize() const {
    OFileFacts facts;
    OGetFacts(m_Path, facts);
    return facts.size;
}

KTUInt64 OFile::GetTimeAttribute(TimeAttribute attribute) const {
    OFileFacts facts;
    OGetFacts(m_Path, facts);
    switch (attribute) {
    case kTimeCreated:
        return facts.created;
    case kTimeModified:
        return facts.modified;
    case kTimeAccessed:
        return facts.accessed;
    default:
        return 0;
    }
}

bool OFile::Rename(OPath const &path) {
    if (OExists(m_Path)) {
        if (OMove(m_Path, path, false) != OError::None) {
            return false;
        }
    } else if (!OIsValidPath(path) && !path.IsEmpty()) {
        return false;
    }
    m_Path = path;
    return true;
}
