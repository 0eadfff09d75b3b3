// Report.cpp: findings as lines and as members.

#include "Report.h"

#include "Show.h"

Report::Report(Console &console, bool isJson, bool findingsAreOutput)
    : m_Console(console), m_FindingsAreOutput(findingsAreOutput),
      m_Json(isJson ? std::make_unique<JsonWriter>(console) : nullptr) {
    if (m_Json) {
        m_Json->BeginObject();
        m_Json->BeginArray("problems");
    }
}

void Report::Add(Finding const &finding) {
    ++m_Count;
    if (m_Json) {
        m_Json->BeginObject();
        m_Json->String("file", finding.file);
        if (finding.line != 0) {
            m_Json->Number("line", finding.line);
        }
        if (finding.byte) {
            m_Json->Number("byte", *finding.byte);
        }
        m_Json->String("kind", finding.kind);
        if (finding.key) {
            m_Json->Key("key", *finding.key);
        }
        m_Json->String("detail", finding.detail);
        m_Json->End();
        return;
    }
    std::string line(finding.file);
    if (finding.line != 0) {
        line += ':';
        line += std::to_string(finding.line);
    }
    line += ": ";
    line += finding.kind;
    line += ": ";
    line += finding.detail;
    if (finding.byte) {
        line += " (byte ";
        line += std::to_string(*finding.byte);
        line += ')';
    }
    if (finding.key) {
        line += " (";
        AppendKey(line, *finding.key);
        line += ")";
    }
    line += '\n';
    if (m_FindingsAreOutput) {
        m_Console.Print(line);
    } else {
        m_Console.PrintError(line);
    }
}

void Report::EndFindings() {
    if (m_Json && m_TakesFindings) {
        m_Json->End();
    }
    m_TakesFindings = false;
}

Status Report::Fail(std::string const &why) {
    if (m_Json) {
        EndFindings();
        while (m_Json->Depth() > 1) {
            m_Json->End();
        }
        m_Json->String("error", why);
    }
    m_Console.PrintError("ktdict: " + why + "\n");
    return Status::Trouble;
}
