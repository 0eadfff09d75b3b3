// RunGuard.cpp: one demo at a time.

#include "RunGuard.h"

#include "KTFileUtil.h"
#include "WDisk.h"

#include <exception>

RunGuard::RunGuard() : m_Path(KTFileUtil::GetSystemTempFolder().GetPath()) {
    m_Path.Append(KTString("ktdemo.lock"));
    DiskTouch(m_Path); // if this fails, the lock says why
    m_Lock = std::make_unique<KTInterProcessFileLock>(m_Path.GetPathAsKTString());
    m_IsHeld = m_Lock->TryLock();
}

RunGuard::~RunGuard() {
    if (m_IsHeld) {
        try {
            m_Lock->Unlock();
        } catch (std::exception const &) {
            // Closing the file releases the lock as well.
            m_IsHeld = false;
        }
    }
}
