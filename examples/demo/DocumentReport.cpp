// DocumentReport.cpp: saving, reading back, comparing and cloning a document.

#include "DocumentReport.h"

#include "FileXferBytes.h"
#include "KTFileUtil.h"
#include "KTStreamUtil.h"
#include "Table.h"

#include <algorithm>
#include <chrono>
#include <memory>

namespace {

using Stream = std::unique_ptr<IKTStream>;

Stream Open(KTFile const &file) {
    return Stream(KTStreamUtil::CreateFileStreamRead(file, FileXferBytes::kOpenRead, 0, 0));
}

bool AreEqual(Stream const &first, Stream const &second) {
    return KTStreamUtil::Compare(first.get(), second.get(), KTStreamUtil::kCompareByteByByte) != 0;
}

std::string YesOrNo(bool yes) { return yes ? "yes" : "no"; }

// Does each step, and notes its bytes and time.
class Steps {
  public:
    template <typename Step> bool Do(std::string const &name, KTFile const &file, Step step) {
        auto const begin = std::chrono::steady_clock::now();
        bool const done = step();
        double const took = std::chrono::duration<double, std::milli>(std::chrono::steady_clock::now() - begin).count();
        m_Table.AddRow({name, Number(file.GetSize()), Number(took, 1), YesOrNo(done)});
        return done;
    }

    std::string Print() const { return m_Table.Print(); }

  private:
    Table m_Table{{{"Step", Table::Align::Left},
                   {"Bytes", Table::Align::Right},
                   {"ms", Table::Align::Right},
                   {"Whole", Table::Align::Left}}};
};

// Checks the files against their digests; then again with one bit changed, which must show.
std::string ReportDigestCheck(CourseDocument &document) {
    DigestCheck const digests = document.CheckDigests();
    std::string text = "  digests that are the stored ones: " + std::to_string(digests.right) + " of " +
                       std::to_string(digests.checked) + "\n";
    auto const file = std::find_if(document.files.begin(), document.files.end(),
                                   [](DocumentFile const &one) { return !one.bytes.empty(); });
    if (file != document.files.end()) {
        file->bytes.back() ^= 1;
        text += "  one changed bit is found: " + YesOrNo(document.CheckDigests().right + 1 == digests.right) + "\n";
        file->bytes.back() ^= 1;
    }
    return text;
}

} // namespace

std::string ReportDocument(CourseDocument &document) {
    KTFile const file = KTFileUtil::GetUniqueTemporaryFile(".ktcourse");
    KTFile const again = KTFileUtil::GetUniqueTemporaryFile(".ktcourse");
    CourseDocument readBack;
    Steps steps;
    Stream clone;
    steps.Do("saved", file, [&] { return document.Save(file); });
    steps.Do("read back", file, [&] { return readBack.Load(file); });
    steps.Do("saved again", again, [&] { return readBack.Save(again); });
    Stream const stream = Open(file);
    bool const isSame = steps.Do("compared", file, [&] { return AreEqual(stream, Open(again)); });
    steps.Do("cloned", file, [&] {
        clone.reset(KTStreamUtil::Clone(stream.get()));
        return clone != nullptr;
    });
    bool const isCloneSame = AreEqual(stream, clone);
    std::string const digests = ReportDigestCheck(readBack);
    return "Document\n" + steps.Print() + "  read back and saved again, the document is the same: " + YesOrNo(isSame) +
           "\n  the clone is the same: " + YesOrNo(isCloneSame) + "\n" + digests + "\n";
}
