#pragma once

#include <QStringList>
#include <QWidget>

class QLabel;
class QSlider;

// The host's slider over a list of named items: the slider picks one item, whose label is shown
// beside it. The current index is -1 exactly when the slider holds no item.
class SgEnumSlider : public QWidget {
    Q_OBJECT
public:
    explicit SgEnumSlider(QWidget *parent = nullptr, const QString &name = QString());
    ~SgEnumSlider() override;

    // Appends an item and returns its index. The first item added becomes current.
    int addItem(const QString &label);

    // Renames item `index`; an index out of range changes nothing and returns false.
    bool renameItem(int index, const QString &label);

    // Removes item `index`; the items after it move down by one. The current item stays the same
    // item when it survives, else the item now at its place (or the last item) becomes current.
    // An index out of range changes nothing and returns false.
    bool removeItem(int index);

    // Removes every item.
    void clear();

    int count() const { return int(m_items.size()); }
    QString itemText(int index) const { return m_items.value(index); }
    QStringList items() const { return m_items; }

    // The current item's index, or -1 when there is none.
    int currentIndex() const { return m_current; }

    // The slider (for tests and styling).
    QSlider *slider() const { return m_slider; }

public slots:
    // Makes item `index` current; an index out of range changes nothing.
    void setCurrentIndex(int index);

signals:
    void currentIndexChanged(int index);

private:
    void setCurrent(int index);
    void showItems();

    QStringList m_items;
    int m_current = -1;
    QSlider *m_slider = nullptr;
    QLabel *m_label = nullptr;
    bool m_showing = false;
};
