// Services.cpp: what the system services say.

#include "Services.h"

#include "KTFileUtil.h"
#include "KTOSVersion.h"
#include "KTProcessUtil.h"
#include "KTSMBUtils.h"
#include "KTSystemUtils.h"
#include "Table.h"

#include <utility>

namespace {

constexpr std::size_t kCellWidth = 40;

std::string VersionText() {
    KTOSVersion::Version const version = KTOSVersion::GetOSVersion();
    return Number(version.majorVersion) + "." + Number(version.minorVersion) + "." + Number(version.buildNumber) +
           (version.isServer ? " (server)" : "");
}

std::string ProcessText() {
    KTUInt32 const self = KTProcessUtil::GetCurrentProcessPID();
    constexpr KTUInt64 kMebibyte = 1U << 20;
    return Number(self) + ", " + Number(KTProcessUtil::GetProcessMemoryUsage(self) / kMebibyte) + " MiB in use" +
           (KTProcessUtil::IsAnotherMeRunning() ? ", not alone" : "");
}

} // namespace

std::string ReportShares(std::vector<TextResult> const &results, ReportLimits const &limits) {
    using enum Table::Align;
    Table table({{"Server", Left}, {"Share", Left}, {"Path", Left}, {"Named in", Left}});
    std::size_t found = 0;
    for (TextResult const &result : results) {
        for (KTString const &text : result.shares) {
            KTSmbUrl const url(text);
            if (url.getShare().empty() || found++ >= limits.texts) {
                continue;
            }
            table.AddRow({PrintableCut(url.getAuthority(), kCellWidth), PrintableCut(url.getShare(), kCellWidth),
                          PrintableTail(url.getSmbPath(), kCellWidth), PrintableTail(result.file.name, kCellWidth)});
        }
    }
    if (found == 0) {
        return "";
    }
    std::string text = "Shares named in the texts\n" + table.Print();
    if (found > limits.texts) {
        text += "  ... and " + Number(found - limits.texts) + " more; --all shows everything\n";
    }
    return text + "\n";
}

std::string ReportSystem(KTPath const &course) {
    std::vector<std::pair<std::string, std::string>> const rows = {
        {"Windows version        ", VersionText()},
        {"process                ", ProcessText()},
        {"new identifier         ", Printable(KTSystemUtils::CreateGUID())},
        {"the folder is on       ", KTFileUtil::OnServerVolume(course) ? "a share" : "this machine"}};
    std::string text = "System\n";
    for (auto const &[name, value] : rows) {
        text.append("  ").append(name).append(value).append("\n");
    }
    return text + "\n";
}
