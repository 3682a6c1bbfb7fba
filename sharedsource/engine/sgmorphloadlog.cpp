#include "sharedsource/engine/sgmorphloadlog.h"

SgMorphLoadLog::SgMorphLoadLog() : m_list(new List{nullptr, nullptr}) {}

SgMorphLoadLog::~SgMorphLoadLog() {
    Entry *entry = m_list->first;
    while (entry) {
        Entry *next = entry->next;
        delete entry;
        entry = next;
    }
    delete m_list;
}

void SgMorphLoadLog::addMessage(const QString &text) {
    append(Message, text);
}

void SgMorphLoadLog::addWarning(const QString &text) {
    append(Warning, text);
}

void SgMorphLoadLog::addError(const QString &text) {
    append(Error, text);
}

void SgMorphLoadLog::append(Kind kind, const QString &text) {
    auto *entry = new Entry{kind, text, nullptr};
    if (m_list->last)
        m_list->last->next = entry;
    else
        m_list->first = entry;
    m_list->last = entry;
}

bool SgMorphLoadLog::hasProblems() const {
    for (const Entry *entry = m_list->first; entry; entry = entry->next) {
        if (entry->kind == Warning || entry->kind == Error)
            return true;
    }
    return false;
}

QString SgMorphLoadLog::toHtml() const {
    QString html = QStringLiteral("<HTML><HEAD></HEAD><BODY>");
    for (const Entry *entry = m_list->first; entry; entry = entry->next) {
        switch (entry->kind) {
        case Error:
            html += QStringLiteral("\n<FONT COLOR=#ff0000>Error: </FONT>");
            break;
        case Warning:
            html += QStringLiteral("\n<FONT COLOR=#0000ff>Warning: </FONT>");
            break;
        default:
            html += QStringLiteral("\n");
            break;
        }
        html += entry->text;
        html += QStringLiteral("<BR>");
    }
    html += QStringLiteral("\n</BODY>");
    return html;
}
