// KTSimpleTimeKeeper.cpp: the stop-watch and its report.

#include "KTSimpleTimeKeeper.h"

#include "KTTickCount.h"
#include "KTTypes.h"
#include "ODebugText.h"

#include <sstream>

struct KTSimpleTimeKeeper::Record {
    std::string name;
    KTUInt32 start = 0; // milliseconds since the library was loaded
    void (*dump)(std::string const &) = nullptr;
    bool isDumped = false;
};

namespace {

constexpr double kMillisecondsPerSecond = 1000.0;

KTUInt32 Now() { return static_cast<KTUInt32>(KTGetTickCountSinceAppStartTime()); }

} // namespace

KTSimpleTimeKeeper::KTSimpleTimeKeeper(std::string const &name) : m_Record(new Record{.name = name}) { Reset(); }

KTSimpleTimeKeeper::KTSimpleTimeKeeper() : KTSimpleTimeKeeper(std::string()) {}

KTSimpleTimeKeeper::~KTSimpleTimeKeeper() {
    DoDumping();
    delete m_Record;
}

void KTSimpleTimeKeeper::Reset() { m_Record->start = Now(); }

double KTSimpleTimeKeeper::GetElapsedTime() const {
    return static_cast<KTInt32>(Now() - m_Record->start) / kMillisecondsPerSecond;
}

void KTSimpleTimeKeeper::SetDumpFunction(void (*dump)(std::string const &)) { m_Record->dump = dump; }

void KTSimpleTimeKeeper::DoDumping() const {
    if (m_Record->isDumped || (m_Record->dump == nullptr && m_Record->name.empty())) {
        return;
    }
    std::ostringstream line;
    line << "PROFILE: Time taken by " << m_Record->name << " = " << GetElapsedTime() << '\n';
    std::string const report = line.str();
    if (m_Record->dump != nullptr) {
        m_Record->dump(report);
    } else {
        ODebugText(report.c_str());
    }
    m_Record->isDumped = true;
}
