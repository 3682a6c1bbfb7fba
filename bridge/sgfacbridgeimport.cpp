// The import of returned geometry onto a scene node whose label equals its name: a morph on the
// node (for a figure, one morph per bone that moved, driven by a control property on the
// figure), a prop, or a copy of the materials, as the user chooses.

#include "bridge/sgbridgemorphdlg.h"
#include "bridge/sgfacbridge.h"

#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/engine/sgmorphloadlog.h"
#include "sharedsource/loaderui/sgmorphloaderdlg.h"

#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgappsettings.h"
#include "sgcore/geometry/sgpolyshape.h"
#include "sgcore/geometry/sgvertexmesh.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/scene/sgbone.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"

#include <QMainWindow>
#include <QMessageBox>
#include <QTextDocumentFragment>

#include <memory>
#include <optional>

namespace {

// The figure's control property as it was before the import touched it, so that an import that
// made no morph can leave the figure exactly as it found it.
class ControlPropertyUndo {
public:
    // A property this import added to the node.
    void added(SgNode *node, SgProperty *property) {
        m_node = node;
        m_added = property;
    }
    // A float property this import reuses; its settings are kept to be put back.
    void reused(SgFloatProperty *property) {
        m_reused = property;
        m_saved =
            Settings{property->getRawValue(), property->getDefaultValue(), property->getMin(),
                     property->getMax(),      property->isClamped(),       property->isHidden(),
                     property->canAnimate(),  property->getPath()};
    }
    // A property of another class that this import took off the node to make room.
    void replaced(SgNode *node, SgProperty *property) {
        m_node = node;
        m_replaced.reset(property);
    }

    // The morph run succeeded: what was replaced is gone for good.
    void commit() { m_replaced.reset(); }

    // The morph run made nothing: put the node's properties back as they were.
    void rollBack(SgMorphLoader &loader) {
        // The loader must not refer to a property that is about to go.
        loader.setControlProperty(nullptr);
        if (m_added && m_node && m_node->findProperty(m_added->getName()) == m_added)
            m_node->removeProperty(m_added->getName());
        if (m_reused && m_saved) {
            m_reused->setValue(m_saved->value);
            m_reused->setDefaultValue(m_saved->defaultValue);
            m_reused->setMin(m_saved->min);
            m_reused->setMax(m_saved->max);
            m_reused->setIsClamped(m_saved->clamped);
            m_reused->setHidden(m_saved->hidden);
            m_reused->setCanAnimate(m_saved->canAnimate);
            m_reused->setPath(m_saved->path);
        }
        if (m_replaced && m_node && m_node->addProperty(m_replaced.get()) == 0)
            (void)m_replaced.release();
    }

private:
    struct Settings {
        float value, defaultValue, min, max;
        bool clamped, hidden, canAnimate;
        QString path;
    };
    SgNode *m_node = nullptr;
    SgProperty *m_added = nullptr;
    SgFloatProperty *m_reused = nullptr;
    std::optional<Settings> m_saved;
    std::unique_ptr<SgProperty> m_replaced;
};

// Sets the loader up to drive the figure's morphs from one control property named as the morph
// (value 1, range -1 to 1, clamped, in the morph group), and returns the targets: every bone.
QList<SgNode *> setUpFigure(SgMorphLoader &loader, SgSkeleton *figure, ControlPropertyUndo &undo) {
    loader.setControlNode(figure);
    loader.setCreateControl(true);
    // The returned mesh is the figure as the host exported it: one welded mesh.
    loader.setScenaraExported(true);
    loader.setIgnoredInvisibleNodes(false);
    loader.setWeldedGeometry(true);
    loader.setRemovedUnusedVertices(true);
    loader.setFourthWeldFlag(true);

    const QString name = loader.morphName();
    SgProperty *existing = figure->findProperty(name);
    auto *control = dynamic_cast<SgFloatProperty *>(existing);
    const bool reuse = control != nullptr && loader.override() != 0;
    if (reuse) {
        undo.reused(control);
    } else {
        if (existing != nullptr && control == nullptr && loader.override() != 0)
            undo.replaced(figure, figure->takeProperty(existing));
        control = new SgFloatProperty(name);
        control->setLabel(name);
    }
    loader.setControlProperty(control);
    control->setDefaultValue(0.0f);
    control->setPath(loader.morphGroup());
    control->setValue(1.0f);
    control->setHidden(false);
    control->setCanAnimate(true);
    control->setMin(-1.0f);
    control->setMax(1.0f);
    control->setIsClamped(true);
    // When the name is taken the property stays with the loader, which places it (or uses the
    // node's namesake) when the run starts.
    if (!reuse && figure->addProperty(control) == 0)
        undo.added(figure, control);

    loader.setCustomLabel(QStringLiteral("p_") + name);
    loader.setUseCustomLabel(true);
    loader.setHideSecondary(true);

    QList<SgNode *> targets;
    for (SgBone *bone : figure->getAllBones())
        targets.append(bone);
    return targets;
}

// The load log as plain text lines, for the host log.
QString plainReport(const SgMorphLoadLog &log) {
    return QTextDocumentFragment::fromHtml(log.toHtml()).toPlainText().trimmed();
}

} // namespace

bool SgFacBridge::importReturnedShape(SgPolyShape *shape, SgNode *node) {
    if (node == nullptr || shape == nullptr)
        return false;
    const QString name = shape->getName();
    SgMorphLoader loader;
    SgMorphLoadLog log;
    loader.setOverride(0);
    loader.setApplyAfterJoint(false);
    const int tools = SgAppSettings().getInt(QStringLiteral("FacetorBridgeTools"), 0);
    // The node left the scene while a dialog was open: nothing of the return is kept.
    auto nodeGone = [&] {
        report(QStringLiteral("%1 left the scene; the geometry returned by Facetor was not "
                              "imported.")
                   .arg(name));
        m_importOutcome = QStringLiteral("refused");
        return true;
    };
    auto declined = [&] {
        report(QStringLiteral("Did not import %1 from Facetor.").arg(name));
        m_importOutcome = QStringLiteral("declined");
        return true;
    };

    QMainWindow *window = sgApp->getInterface();
    if (window == nullptr) {
        loader.setMorphName(QStringLiteral("MyMorph"));
        loader.setMorphGroup(QStringLiteral("Morphs"));
    } else if (tools != 0) {
        // The dialog makes the morph on this road; the bridge makes none of its own.
        importThroughMorphLoader(shape, node);
        return true;
    } else {
        SgBridgeMorphDlg dialog(node->getLabel(), window, node);
        int result = QDialog::Rejected;
        if (!runImportDialog(dialog, result))
            return nodeGone();
        if (result != QDialog::Accepted)
            return declined();
        loader.setMorphGroup(dialog.getGroupPath());
        loader.setMorphName(dialog.getMorphName());
        loader.setOverride(dialog.getOverride() ? 1 : 0);
        const QString action = dialog.getActionText();
        if (action.contains(QLatin1String("Material"))) {
            copyMaterials(shape, node);
            report(QStringLiteral("Copied the materials of %1 from Facetor.").arg(name));
            if (!action.contains(QLatin1String("Morph")))
                return true;
        } else if (action.contains(QLatin1String("Prop"))) {
            createPropFromShape(shape);
            return true;
        } else if (!action.contains(QLatin1String("Morph"))) {
            return declined();
        }
    }

    ControlPropertyUndo undo;
    QList<SgNode *> targets;
    if (auto *figure = dynamic_cast<SgSkeleton *>(node))
        targets = setUpFigure(loader, figure, undo);
    else
        targets.append(node);

    SgVertexMesh *geometry = shape->getGeometry();
    if (geometry != nullptr)
        geometry->ref();
    loader.createMorphForNodes(geometry, targets, log);
    if (geometry != nullptr)
        geometry->unref();
    sgApp->log(plainReport(log));

    if (log.hasProblems()) {
        // No morph was made: the figure keeps the control property it had, if any.
        undo.rollBack(loader);
        QMessageBox question(
            QMessageBox::Question, SgFacBridge::tr("Changed Geometry"),
            SgFacBridge::tr("The geometry has changed and cannot create a morph.\nWould you like "
                            "to import it as a prop instead?"),
            QMessageBox::Yes | QMessageBox::No, sgApp->getDialogParent());
        question.setDefaultButton(QMessageBox::Yes);
        question.setEscapeButton(QMessageBox::No);
        int answer = QMessageBox::No;
        if (!runImportDialog(question, answer))
            return nodeGone();
        return answer == QMessageBox::Yes ? false : declined();
    }
    undo.commit();
    report(
        QStringLiteral("Imported %1 from Facetor as the morph %2.").arg(name, loader.morphName()));
    return true;
}

void SgFacBridge::importThroughMorphLoader(SgPolyShape *shape, SgNode *node) {
    if (shape == nullptr || node == nullptr)
        return;
    const QString name = shape->getName();
    // The source refers to the geometry while the dialog lists it; the shape keeps owning it.
    SgMorphLoaderDlg dialog(sgApp->getInterface(), false, shape->getGeometry(), node);
    int result = QDialog::Rejected;
    if (!runImportDialog(dialog, result)) {
        report(QStringLiteral("%1 left the scene; the geometry returned by Facetor was not "
                              "imported.")
                   .arg(name));
        m_importOutcome = QStringLiteral("refused");
        return;
    }
    if (result != QDialog::Accepted) {
        report(QStringLiteral("Did not import %1 from Facetor.").arg(name));
        m_importOutcome = QStringLiteral("declined");
        return;
    }
    const QString action = dialog.actionText();
    if (action.contains(QLatin1String("Material"))) {
        copyMaterials(shape, node);
        report(QStringLiteral("Copied the materials of %1 from Facetor.").arg(name));
    } else if (action.contains(QLatin1String("Prop"))) {
        createPropFromShape(shape);
    } else {
        report(QStringLiteral("Imported %1 from Facetor through the Target Importer.").arg(name));
    }
}
