#include "app/sgpropertypanel.h"

#include "sgcore/geometry/sgmodifier.h"
#include "sgcore/geometry/sgobject.h"
#include "sgcore/properties/sgnumericproperty.h"
#include "sgcore/scene/sgnode.h"

#include <QDoubleSpinBox>
#include <QHeaderView>

#include <limits>

namespace {
// Spin boxes of unclamped properties still need bounds; these are wide enough for any slider.
constexpr double kUnclampedLimit = 1.0e6;
} // namespace

SgPropertyPanel::SgPropertyPanel(QWidget *parent) : QTreeWidget(parent) {
    setObjectName(QStringLiteral("SgPropertyPanel"));
    setColumnCount(2);
    setHeaderLabels({tr("Property"), tr("Value")});
    // Labels are shown whole: the label column takes its contents' width, the value column
    // the rest.
    header()->setStretchLastSection(true);
    header()->setSectionResizeMode(0, QHeaderView::ResizeToContents);
    setTextElideMode(Qt::ElideNone);
    setRootIsDecorated(true);
}

void SgPropertyPanel::showNode(SgNode *node) {
    m_node = node;
    refresh();
}

void SgPropertyPanel::refresh() {
    clear();
    if (m_node == nullptr)
        return;
    auto *nodeSection = new QTreeWidgetItem(this, {m_node->getLabel()});
    addRows(nodeSection, m_node);
    if (SgObject *object = m_node->getObject()) {
        addRows(nodeSection, object);
        for (SgModifier *modifier : object->getModifiers()) {
            auto *section = new QTreeWidgetItem(nodeSection, {modifier->getLabel()});
            addRows(section, modifier);
            if (section->childCount() == 0)
                delete section;
        }
    }
    expandAll();
}

void SgPropertyPanel::addRows(QTreeWidgetItem *section, SgElement *element) {
    for (SgProperty *property : element->getProperties()) {
        auto *numeric = dynamic_cast<SgNumericProperty *>(property);
        if (numeric == nullptr)
            continue;
        auto *row = new QTreeWidgetItem(section, {numeric->getLabel()});
        // The tooltip gives the property's full path in its group tree and its name.
        const QString path = numeric->getPath().isEmpty()
                                 ? numeric->getLabel()
                                 : numeric->getPath() + QLatin1Char('/') + numeric->getLabel();
        row->setToolTip(0, numeric->getName() == numeric->getLabel()
                               ? path
                               : tr("%1 (name: %2)").arg(path, numeric->getName()));
        if (numeric->isHidden())
            row->setForeground(0, palette().color(QPalette::Disabled, QPalette::Text));
        auto *spin = new QDoubleSpinBox(this);
        spin->setObjectName(QStringLiteral("SgPropertyValue_") + numeric->getName());
        spin->setDecimals(3);
        spin->setSingleStep(0.1);
        if (numeric->isClamped())
            spin->setRange(numeric->getMin(), numeric->getMax());
        else
            spin->setRange(-kUnclampedLimit, kUnclampedLimit);
        spin->setValue(numeric->getValue());
        spin->setToolTip(row->toolTip(0));
        connect(spin, &QDoubleSpinBox::valueChanged, this,
                [this, numeric](double value) { setValue(numeric, value); });
        setItemWidget(row, 1, spin);
    }
}

void SgPropertyPanel::setValue(SgNumericProperty *property, double value) {
    property->setValue(static_cast<float>(value));
    emit valueEdited(property);
}
