// PicturePage.h: a page of pictures: index.html and PNG files beside it.

#pragma once

#include "Canvas.h"

#include "KTPath.h"

#include <string>

/// Writes pictures as they come and the page at the end.
class PicturePage {
  public:
    /// Makes the folder if it is not there. An empty path makes a page that takes everything and writes nothing.
    PicturePage(KTPath const &folder, std::string const &title);

    void Heading(std::string const &text);

    /// Writes NAME.png and shows it with its caption, the former as wide as the page allows.
    void Picture(std::string const &name, std::string const &caption, soft::Canvas const &canvas);

    /// Writes the page. Returns what is wrong: that something could not be written; else nothing.
    std::string Finish();

    bool IsWritten() const { return m_IsWritten; }

    /// The page's full path, ready to print.
    std::string Location() const;

  private:
    KTPath In(std::string const &name) const;
    void Write(std::string const &name, std::string const &bytes);

    KTPath m_Folder;
    bool m_IsWritten;
    bool m_HasFailed = false;
    std::string m_Html;
};
