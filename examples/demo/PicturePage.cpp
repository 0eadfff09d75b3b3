// PicturePage.cpp: a page of pictures.

#include "PicturePage.h"

#include "KTFileUtil.h"
#include "Table.h"
#include "WDisk.h"

namespace {

constexpr char kIndex[] = "index.html";

constexpr char kStart[] = R"(<!DOCTYPE html>
<html lang="en">
<meta charset="utf-8">
<meta name="viewport" content="width=device-width">
<style>
body { font: 15px/1.4 sans-serif; margin: 2em auto; max-width: 75em; padding: 0 1em; color: #222; }
figure { margin: 0 0 1.5em; }
img { max-width: 100%; border: 1px solid #999; background: repeating-conic-gradient(#ddd 0 25%, #fff 0 50%) 0 0/16px 16px; }
figcaption { color: #555; }
</style>
)";

std::string Escaped(std::string const &text) {
    std::string escaped;
    for (char const letter : text) {
        switch (letter) {
        case '&':
            escaped += "&amp;";
            break;
        case '<':
            escaped += "&lt;";
            break;
        case '"':
            escaped += "&quot;";
            break;
        default:
            escaped += letter;
        }
    }
    return escaped;
}

} // namespace

PicturePage::PicturePage(KTPath const &folder, std::string const &title)
    : m_Folder(folder), m_IsWritten(!folder.GetPathAsKTString().empty()) {
    m_Html = kStart;
    m_Html += "<title>" + Escaped(title) + "</title>\n<h1>" + Escaped(title) + "</h1>\n";
    if (m_IsWritten && !DiskIsFolder(m_Folder)) {
        m_HasFailed = KTFileUtil::CreateDirectoryW(m_Folder, true) != KTFileUtil::kErrorNone;
    }
}

void PicturePage::Heading(std::string const &text) { m_Html += "<h2>" + Escaped(text) + "</h2>\n"; }

void PicturePage::Picture(std::string const &name, std::string const &caption, soft::Canvas const &canvas) {
    if (!m_IsWritten) {
        return;
    }
    Write(name + ".png", soft::EncodePng(canvas));
    m_Html += "<figure><img src=\"" + name + ".png\" width=\"" + std::to_string(canvas.Width()) + "\" alt=\"" +
              Escaped(caption) + "\"><figcaption>" + Escaped(caption) + "</figcaption></figure>\n";
}

std::string PicturePage::Finish() {
    if (m_IsWritten) {
        Write(kIndex, m_Html + "</html>\n");
    }
    return m_HasFailed ? "the page of pictures could not be written: " + Location() : "";
}

std::string PicturePage::Location() const { return Printable(In(kIndex).GetPathAsKTString()); }

KTPath PicturePage::In(std::string const &name) const {
    KTPath path(m_Folder);
    path.Append(KTString(name.c_str(), KTString::kKTEncodingUTF8));
    return path;
}

void PicturePage::Write(std::string const &name, std::string const &bytes) {
    m_HasFailed = m_HasFailed || bytes.empty() || !DiskWrite(In(name), bytes);
}
