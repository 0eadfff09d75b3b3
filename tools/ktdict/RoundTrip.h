// RoundTrip.h: what becomes of entries that are written and read again.

#pragma once

#include "DictionaryReader.h"
#include "LoadedFile.h"
#include "Report.h"

/// Whether the form can hold the entry's key at all.
bool CanHoldKey(Entry const &entry, orvik_private::DictionaryForm const &form);

/// The text as the text form keeps it whatever it holds: backslashes, carets, "#{", zeros and, in ANSI, characters that
/// the code page has not are written as entities by their numbers.
KTUnits EscapedForTextForm(orvik_private::UnitsView text, int encoding);

/// Compares what was to be written with what was read back, and reports each entry of the source that is not there or
/// has another text, once for each reason:
///
///     unwritable-key       the form cannot hold the key; the entry is left out
///     backslash, caret, entity   read as an escape
///     unmappable-text      the ANSI code page has not all its characters
///     unpaired-surrogate   UTF-8 cannot hold half of a character
///     changed-text         any other
void ReportChanges(LoadedFile const &source, orvik_private::DictionaryReader const &written,
                   orvik_private::DictionaryForm const &form, Report &report);
