#pragma once

#include <QString>

// The report of one morph-loading run: messages, warnings and errors in the order they happen.
// The loader writes to it; the caller tests it afterwards (`hasProblems`) and may show it as HTML.
// Entries are kept in a singly linked list, appended at the tail and freed only on destruction.
class SgMorphLoadLog {
public:
    // Kind of an entry; the numbers are part of the entry layout.
    enum Kind : qint32 { Message = 0, Warning = 1, Error = 2 };

    SgMorphLoadLog();
    virtual ~SgMorphLoadLog();
    SgMorphLoadLog(const SgMorphLoadLog &) = delete;
    SgMorphLoadLog &operator=(const SgMorphLoadLog &) = delete;

    // Append an entry of kind Message, Warning or Error. O(1).
    void addMessage(const QString &text);
    void addWarning(const QString &text);
    void addError(const QString &text);

    // True when at least one entry is a warning or an error. O(entries).
    bool hasProblems() const;

    // The whole report: "<HTML><HEAD></HEAD><BODY>", then per entry a kind prefix ("\n" for a
    // message, "\n" and a red "Error: " or a blue "Warning: " font tag otherwise), the text as
    // given (not escaped) and "<BR>", and finally "\n</BODY>". No closing HTML tag is written.
    QString toHtml() const;

private:
    struct Entry {
        qint32 kind;
        QString text;
        Entry *next;
    };
    struct List {
        Entry *first;
        Entry *last;
    };

    void append(Kind kind, const QString &text);

    List *m_list;
};
