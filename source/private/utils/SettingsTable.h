// SettingsTable.h: what KTSimpleIniFileReader.h describes, read from a stream.

#pragma once

#include "TextLines.h"

#include <map>
#include <memory_resource>
#include <optional>
#include <vector>

/// The variables of a settings file by section. Names and values lie one after the other in pieces of memory that go
/// with the table, as nothing is ever taken out of it: one piece for each of thousands of variables.
class SettingsTable {
  public:
    using Text = orvik_private::UnitsView;

    SettingsTable() = default;
    SettingsTable(SettingsTable const &) = delete;
    SettingsTable &operator=(SettingsTable const &) = delete;
    ~SettingsTable() = default;

    /// Adds what the stream holds. A stream that is null, not ready, or that fails on the way is reported, and the table
    /// is empty then: half of the settings would pass for all of them. Throws std::bad_alloc. Not on two threads at a
    /// time, not even for two tables: the name of the section that is being read is one for the process.
    void Read(IKTStream *stream);

    /// The value; nothing if there is no such section or variable in it. Any number of threads after Read.
    std::optional<Text> Find(Text section, Text variable) const;

    /// Whether the file was UTF-16.
    bool IsUtf16() const noexcept { return m_IsUtf16; }

  private:
    using Section = std::pmr::map<Text, Text>;

    void AddLine(Text line);
    void BeginSection(Text line, std::size_t closing);
    void StoreGathered();
    static void StoreLine(Section &section, Text line);
    Text Keep(Text text);

    std::pmr::monotonic_buffer_resource m_Memory;
    std::pmr::map<Text, Section> m_Sections{&m_Memory};
    std::vector<Text> m_Gathered; // variable lines of the section that is being read
    bool m_IsUtf16 = false;
};
