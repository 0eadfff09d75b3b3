// Report.h: where the commands put what they find.

#pragma once

#include "CommandLine.h"
#include "Json.h"

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <string_view>

/// Something wrong in a file, or something to know about it.
struct Finding {
    std::string_view file;  ///< as the user wrote it
    std::uint64_t line = 0; ///< from 1; 0 when there is none
    std::optional<std::uint64_t> byte;
    std::string_view kind;
    std::optional<std::string_view> key;
    std::string_view detail; ///< English
};

/// The output of one command: as text, or as one JSON document whose first member, "problems", has the findings.
///
///     text   FILE:LINE: KIND: DETAIL (KEY)
///     JSON   {"file": ..., "line": ..., "byte": ..., "kind": ..., "key": ..., "detail": ...}
class Report {
  public:
    /// In text form findings go to the standard output, or to the error stream when other output goes there.
    Report(Console &console, bool isJson, bool findingsAreOutput);

    bool IsJson() const noexcept { return m_Json != nullptr; }
    Console &Out() noexcept { return m_Console; }

    /// REQUIRES: IsJson().
    JsonWriter &Json() noexcept { return *m_Json; }

    /// Reports a finding; the status is Found from then on, or worse. REQUIRES: EndFindings has not been called.
    void Add(Finding const &finding);

    /// No finding comes any more: other members may follow in the document.
    void EndFindings();

    /// Tells on the error stream why the work cannot be done, and in the document, if there is one, as "error". Returns
    /// Status::Trouble.
    Status Fail(std::string const &why);

    std::uint64_t Count() const noexcept { return m_Count; }

    /// Fine, or Found when there were findings.
    Status Result() const noexcept { return m_Count == 0 ? Status::Fine : Status::Found; }

  private:
    Console &m_Console;
    bool m_FindingsAreOutput;
    bool m_TakesFindings = true;
    std::uint64_t m_Count = 0;
    std::unique_ptr<JsonWriter> m_Json;
};
