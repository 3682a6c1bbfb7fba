// The morph loader dialog as a user drives it: the run and the two-step close, the stored
// settings, file choice, the save options and the configuration files it writes and reads.

#include "loadertestsupport.h"
#include "sgcore/app/sgapp.h"
#include "sgcore/app/sgappsettings.h"
#include "sgcore/morph/sgmorph.h"
#include "sgcore/properties/sgfloatproperty.h"
#include "sgcore/scene/sgscene.h"
#include "sgcore/scene/sgskeleton.h"
#include "sgcore/settings/sgpropertysettings.h"
#include "sharedsource/engine/sgmorphloader.h"
#include "sharedsource/loaderui/sgconfigurationsaveoptionsdlg.h"
#include "sharedsource/loaderui/sgmorphconfiguration.h"
#include "sharedsource/loaderui/sgmorphfileitem.h"
#include "sharedsource/loaderui/sgmorphloaderdlg.h"

#include <QCheckBox>
#include <QComboBox>
#include <QDialogButtonBox>
#include <QDir>
#include <QDomDocument>
#include <QFile>
#include <QLabel>
#include <QMessageBox>
#include <QPushButton>
#include <QRadioButton>
#include <QTemporaryDir>
#include <QTest>
#include <memory>

namespace {

// Answers the save options dialog: objects saved or not, relative or absolute paths, "Ok".
SgTestHandler saveOptions(bool saveObjects, bool relative) {
    return sgTestAs<SgConfigurationSaveOptionsDlg>([=](SgConfigurationSaveOptionsDlg *dialog) {
        dialog->findChild<QCheckBox *>("MorphLoaderSaveObjectConfigurationCheckBox")
            ->setChecked(saveObjects);
        dialog
            ->findChild<QRadioButton *>(relative ? "MorphLoaderRelativePathButton"
                                                 : "MorphLoaderAbsolutePathButton")
            ->setChecked(true);
        dialog->buttonBox()->button(QDialogButtonBox::Ok)->click();
    });
}

const QByteArray TriangleObj = "v 0 0 0\nv 1 0 0\nv 0 1 0\nf 1 2 3\n";

QString value(QTreeWidgetItem *source, const QString &key) {
    SgMorphSourceItem *row = findRow(source, key);
    return row ? row->valueText() : QStringLiteral("<missing>");
}

// Every row's key and value, in shown order.
QStringList allValues(QTreeWidgetItem *row) {
    QStringList values;
    for (int i = 0; i < row->childCount(); ++i) {
        auto *child = static_cast<SgMorphSourceItem *>(row->child(i));
        values << child->settingKey() + "=" + child->valueText();
        values << allValues(child);
    }
    return values;
}

SgMorphFileItem *topSource(SgMorphLoaderDlg &dialog) {
    return static_cast<SgMorphFileItem *>(dialog.sourceList()->topLevelItem(0));
}

class MorphLoaderDlgTest : public ::testing::Test {
protected:
    void SetUp() override {
        ASSERT_TRUE(m_dir.isValid());
        sgApp->getScene()->clear();
        m_figure = new SgSkeleton("Figure");
        sgApp->getScene()->addNode(m_figure);
        sgApp->getScene()->selectNode(m_figure);
        SgAppSettings(QStringLiteral("TargetImporter")).remove("LastDirectory");
        SgAppSettings().remove("LastDirectory");
    }
    void TearDown() override { sgApp->getScene()->clear(); }
    QString path(const QString &name) const { return m_dir.path() + "/" + name; }

    QTemporaryDir m_dir;
    SgSkeleton *m_figure = nullptr;
};

} // namespace

TEST_F(MorphLoaderDlgTest, ObjectFileOfDefaultsIsByteExact) {
    SgMorphLoaderDlg dialog(nullptr, true, nullptr, nullptr);
    dialog.sourceList()->addFile(path("head.obj"));
    dialog.saveObjectConfiguration(path("head.obj"), topSource(dialog), m_dir.path());
    const QByteArray expected = "<VarnTargetImporter Version=\"1\">\n"
                                " <FileType Type=\"Object\">\n"
                                "  <ScenaraExported Value=\"False\">\n"
                                "   <ScExportIgnoredInvisibleNodes Value=\"True\"/>\n"
                                "   <ScExportWeldedGeom Value=\"False\"/>\n"
                                "   <ScExportRemovedUnusedVerts Value=\"False\"/>\n"
                                "  </ScenaraExported>\n"
                                "  <Name Value=\"head\"/>\n"
                                "  <PropertyGroup Value=\"Morphs/Morph Loader\"/>\n"
                                "  <CreateControlProperty Value=\"True\">\n"
                                "   <ERCType Value=\"0\">\n"
                                "    <UseCustom Value=\"False\">\n"
                                "     <CustomValue Value=\"1\"/>\n"
                                "    </UseCustom>\n"
                                "   </ERCType>\n"
                                "   <Node Value=\"Figure\"/>\n"
                                "   <Property Value=\"head\"/>\n"
                                "   <UseSecondaryLabel Value=\"False\">\n"
                                "    <Label Value=\"head\"/>\n"
                                "   </UseSecondaryLabel>\n"
                                "   <HideSecondaryProperties Value=\"False\"/>\n"
                                "  </CreateControlProperty>\n"
                                "  <ReverseDeformations Value=\"False\">\n"
                                "   <Pose Value=\"None\"/>\n"
                                "  </ReverseDeformations>\n"
                                "  <ApplyAfterJointBinding Value=\"False\"/>\n"
                                "  <UpdateOverrideExisting Value=\"Make Unique\">\n"
                                "   <CleanUp Value=\"True\"/>\n"
                                "  </UpdateOverrideExisting>\n"
                                " </FileType>\n"
                                "</VarnTargetImporter>\n";
    EXPECT_EQ(sgTestReadFile(path("head.obj.scx")), expected);
    // A source without setting rows writes no file.
    qDeleteAll(topSource(dialog)->takeChildren());
    dialog.saveObjectConfiguration(path("empty.obj"), topSource(dialog), m_dir.path());
    EXPECT_FALSE(QFile::exists(path("empty.obj.scx")));
}

TEST_F(MorphLoaderDlgTest, ProjectPathsRelativeAbsoluteAndNetwork) {
    for (const char *name : {"proj/a.obj", "proj/c.obj", "proj-other/b.obj"})
        sgTestWriteFile(path(name), TriangleObj);
    {
        SgMorphLoaderDlg dialog(nullptr, true, nullptr, nullptr);
        dialog.sourceList()->addFiles(
            {path("proj-other/b.obj"), path("proj/c.obj"), path("proj/a.obj")});
        QString warning;
        SgTestModalAnswer script(sgTestPressButton(QMessageBox::NoButton, nullptr, &warning));
        dialog.saveProjectConfiguration(path("proj/set"));
        // The sibling folder that only starts with the project folder's name is outside it.
        EXPECT_EQ(script.titles(), QStringList{"Relative Path Warning"});
        EXPECT_EQ(warning, "The file, " + path("proj-other/b.obj") +
                               ",is not in the relative path and will be saved as absolute.");
        // The order of two attributes in an element is the DOM's own; the values are compared.
        QDomDocument project;
        ASSERT_TRUE(project.setContent(sgTestReadFile(path("proj/set.scx"))));
        const QDomNodeList objects = project.elementsByTagName("Object");
        ASSERT_EQ(objects.size(), 3);
        EXPECT_EQ(objects.at(0).toElement().attribute("Name"), "a.obj");
        EXPECT_EQ(objects.at(0).toElement().attribute("Path"), "/a.obj");
        EXPECT_EQ(objects.at(2).toElement().attribute("Path"), path("proj-other/b.obj"));
        EXPECT_TRUE(QFile::exists(path("proj/a.obj.scx")));
    }
    // The project moved with its geometry loads the moved copy in the saved order, skips
    // geometry that is gone without a word, and reads the object file beside the geometry.
    sgTestWriteFile(path("copy/set.scx"), sgTestReadFile(path("proj/set.scx")));
    sgTestWriteFile(path("copy/a.obj"), TriangleObj);
    sgTestWriteFile(path("copy/a.obj.scx"),
                    "<VarnTargetImporter><FileType Type=\"Object\">"
                    "<Name Value=\"second\"/></FileType></VarnTargetImporter>");
    SgMorphLoaderDlg dialog(nullptr, true, nullptr, nullptr);
    SgTestModalAnswer script(QList<SgTestHandler>{});
    dialog.loadConfigurationFile(path("copy/set.scx"), path("copy"));
    EXPECT_TRUE(script.titles().isEmpty());
    EXPECT_EQ(rowPaths(*dialog.sourceList()),
              (QStringList{path("copy/a.obj"), path("proj-other/b.obj")}));
    EXPECT_EQ(value(dialog.sourceList()->topLevelItem(0), "Name"), "second");
    EXPECT_EQ(value(dialog.sourceList()->topLevelItem(1), "Name"), "b");

    EXPECT_EQ(SgMorphConfiguration::resolvePath("E:/copy", "/a.obj"), "E:/copy/a.obj");
    EXPECT_EQ(SgMorphConfiguration::resolvePath("E:/copy", "//server/share/y.obj"),
              "//server/share/y.obj");
    EXPECT_EQ(SgMorphConfiguration::resolvePath("E:/copy", "E:/x/y.obj"), "E:/x/y.obj");
    // An absolute path of this platform is kept when only it exists: a path under the project
    // folder wins.
    EXPECT_EQ(SgMorphConfiguration::resolvePath("/nowhere", path("proj/a.obj")),
              path("proj/a.obj"));
    sgTestWriteFile(path("copy") + path("proj/a.obj"), TriangleObj);
    EXPECT_EQ(SgMorphConfiguration::resolvePath(path("copy"), path("proj/a.obj")),
              path("copy") + path("proj/a.obj"));
}

TEST_F(MorphLoaderDlgTest, BrokenFilesEndInLoadErrors) {
    const auto nested = [](int depth) {
        return "<VarnTargetImporter>" + QByteArray("<a>").repeated(depth - 1) +
               QByteArray("</a>").repeated(depth - 1) + "</VarnTargetImporter>";
    };
    const struct {
        QByteArray bytes;
        QString file;
        QString message;
    } cases[] = {
        {"not xml <<", "a.scx", "Error: Document could not set as xml."},
        {"<Other Version=\"1\"><FileType Type=\"Object\"/></Other>", "b.scx",
         "Unexpected Root tag name 'Other'...Expected 'VarnTargetImporter'"},
        {"<VarnTargetImporter Version=\"1\"/>", "c.scx", "Root Element Has No Children"},
        {"<VarnTargetImporter><FileType Type=\"Scene\"/></VarnTargetImporter>", "d.scx",
         "XML Parse error, Improper Configuration type."},
        {"<VarnTargetImporter><FileType Type=\"Object\"><Name Value=\"x\"/></FileType>"
         "</VarnTargetImporter>",
         "x.obj.scx",
         "Could not locate Object file, make sure the file is located in the same directory as "
         "the Configuration."},
        // Nesting up to 64 elements is read; deeper is refused before the document is built.
        {nested(64), "deep64.scx", "XML Parse error, Improper Configuration type."},
        {nested(65), "deep65.scx", "Error: Document could not set as xml."},
        {{}, "absent.scx", "Error: Could not open file"},
    };
    for (const auto &entry : cases) {
        if (!entry.bytes.isNull())
            sgTestWriteFile(path(entry.file), entry.bytes);
        SgMorphLoaderDlg dialog(nullptr, true, nullptr, nullptr);
        QString text;
        SgTestModalAnswer script(sgTestPressButton(QMessageBox::NoButton, nullptr, &text));
        dialog.loadConfigurationFile(path(entry.file), m_dir.path());
        EXPECT_EQ(script.titles(), QStringList{"Load Error"}) << entry.file.toStdString();
        EXPECT_EQ(text, entry.message);
        EXPECT_EQ(dialog.sourceList()->topLevelItemCount(), 0);
    }
}

TEST_F(MorphLoaderDlgTest, SaveThenLoadReproducesEveryRowAndTheControlProperty) {
    sgTestWriteFile(path("head.obj"), TriangleObj);
    QStringList saved;
    SgPropertySettings savedAttributes;
    {
        SgMorphLoaderDlg dialog(nullptr, true, nullptr, nullptr);
        dialog.sourceList()->addFile(path("head.obj"));
        SgMorphFileItem *source = topSource(dialog);
        for (const auto &[key, text] :
             QList<QPair<QString, QString>>{{"ScenaraExported", "True"},
                                            {"ScExportIgnoredInvisibleNodes", "False"},
                                            {"ScExportWeldedGeom", "True"},
                                            {"ScExportRemovedUnusedVerts", "True"},
                                            {"Name", "smile"},
                                            {"PropertyGroup", "Morphs/Face"},
                                            {"UseCustom", "True"},
                                            {"CustomValue", "0.25"},
                                            {"UseSecondaryLabel", "True"},
                                            {"Label", "Grin"},
                                            {"HideSecondaryProperties", "True"},
                                            {"ReverseDeformations", "True"},
                                            {"Pose", path("poses/p.ds")},
                                            {"ApplyAfterJointBinding", "True"},
                                            {"UpdateOverrideExisting", "Deltas and ERC Links"},
                                            {"CleanUp", "False"}})
            findRow(source, key)->setValueText(text);
        // Attributes that must come back exactly: markup in the label, extreme floats.
        auto *property = new SgFloatProperty("smile");
        property->setLabel("Smile <Control> & \"more\"");
        property->setMin(-3.4028235e38f);
        property->setMax(2.0f);
        property->setDefaultValue(-1.0e-30f);
        property->setSensitivity(0.0037f);
        property->setValue(0.1f);
        property->setDisplayAsPercent(true);
        property->setCanAnimate(false);
        source->loader().setControlProperty(property);
        property->getAttributes(savedAttributes);
        saved = allValues(source);
        dialog.saveObjectConfiguration(path("head.obj"), source, m_dir.path());
    }
    EXPECT_TRUE(sgTestReadFile(path("head.obj.scx")).contains("Value=\"/poses/p.ds\""));
    SgMorphLoaderDlg dialog(nullptr, true, nullptr, nullptr);
    dialog.loadConfigurationFile(path("head.obj.scx"), m_dir.path());
    ASSERT_EQ(dialog.sourceList()->topLevelItemCount(), 1);
    EXPECT_EQ(allValues(topSource(dialog)), saved);
    // Each row's text reached the loader.
    const SgMorphLoader &l = topSource(dialog)->loader();
    EXPECT_TRUE(l.scenaraExported() && l.weldedGeometry() && l.removedUnusedVertices() &&
                l.useCustomValue() && l.useCustomLabel() && l.hideSecondary() &&
                l.reverseModifiers() && l.applyAfterJoint() && l.createControl());
    EXPECT_FALSE(l.ignoredInvisibleNodes() || l.cleanUpOrphans());
    EXPECT_EQ(QStringList({l.morphName(), l.morphGroup(), l.customLabel(), l.poseFile()}),
              QStringList({"smile", "Morphs/Face", "Grin", path("poses/p.ds")}));
    EXPECT_FLOAT_EQ(l.customValue(), 0.25f);
    EXPECT_EQ(l.override(), SgMorphLoader::DeltasAndLinks);
    SgNumericProperty *loaded = topSource(dialog)->loader().controlProperty();
    ASSERT_NE(loaded, nullptr);
    SgPropertySettings loadedAttributes;
    loaded->getAttributes(loadedAttributes);
    EXPECT_TRUE(loadedAttributes == savedAttributes);

    // Loading again over a source whose control property is one of the scene's leaves that
    // property as it is: the file's attributes go to a new, unattached property.
    auto *existing = new SgFloatProperty("Existing");
    existing->setLabel("Existing Label");
    existing->setMax(5.0f);
    m_figure->addProperty(existing);
    topSource(dialog)->loader().setControlProperty(existing);
    dialog.loadConfigurationFile(path("head.obj.scx"), m_dir.path());
    EXPECT_EQ(QStringList({existing->getName(), existing->getLabel()}),
              QStringList({"Existing", "Existing Label"}));
    EXPECT_FLOAT_EQ(existing->getMax(), 5.0f);
    EXPECT_EQ(m_figure->findProperty("Existing"), existing);
    loaded = topSource(dialog)->loader().controlProperty();
    ASSERT_TRUE(loaded && loaded != existing);
    EXPECT_EQ(loaded->getOwner(), nullptr);
    EXPECT_EQ(loaded->getLabel(), QString("Smile <Control> & \"more\""));

    // The file's geometry is listed already: its settings go to that row, with no warning;
    // what the file leaves out goes back to its default.
    sgTestWriteFile(path("head.obj.scx"), "<VarnTargetImporter Version=\"1\"><FileType "
                                          "Type=\"Object\"><Name Value=\"x\"/></FileType>"
                                          "</VarnTargetImporter>");
    SgTestModalAnswer script(QList<SgTestHandler>{});
    dialog.loadConfigurationFile(path("head.obj.scx"), m_dir.path());
    EXPECT_TRUE(script.titles().isEmpty());
    ASSERT_EQ(dialog.sourceList()->topLevelItemCount(), 1);
    EXPECT_EQ(QStringList({value(topSource(dialog), "Name"),
                           value(topSource(dialog), "UpdateOverrideExisting")}),
              QStringList({"x", "Make Unique"}));
}

TEST_F(MorphLoaderDlgTest, ChooseFilesThenSaveOptionsCancelAbsoluteAndWithoutObjects) {
    const QString documents = path("docs");
    QDir().mkpath(documents);
    sgApp->setDocumentsPath(documents);
    sgTestWriteFile(path("geo/a.obj"), TriangleObj);
    SgMorphLoaderDlg dialog(nullptr, true, nullptr, nullptr);
    auto *browse = dialog.findChild<QPushButton *>("MorphLoaderBrowseBtn");
    QString directory;
    {
        // Files are first chosen in the documents folder; the folder of the choice is kept.
        SgTestModalAnswer script(sgTestChooseFile(path("geo/a.obj"), &directory));
        browse->click();
        EXPECT_EQ(directory, documents);
        EXPECT_EQ(rowPaths(*dialog.sourceList()), QStringList{path("geo/a.obj")});
        EXPECT_EQ(SgAppSettings("TargetImporter").getString("LastDirectory"), path("geo"));
    }
    // Configurations are saved in a folder of their own, kept apart from the files' folder.
    auto *save = dialog.findChild<QPushButton *>("MorphLoaderSaveConfigurationBtn");
    dialog.configuration().setRelativePaths(false);
    {
        SgTestModalAnswer script([](QWidget *w) { w->close(); });
        save->click();
        EXPECT_EQ(script.titles(), QStringList{"Project Save Options"});
        EXPECT_FALSE(dialog.relativePaths());
        EXPECT_TRUE(dialog.saveObjectConfigurations());
    }
    QDir().mkpath(path("projects"));
    {
        SgTestModalAnswer script(
            {saveOptions(true, false), sgTestChooseFile(path("projects/abs.scx"))});
        save->click();
        EXPECT_EQ(script.titles(),
                  (QStringList{"Project Save Options", "Choose a Configuration file"}));
        EXPECT_TRUE(sgTestReadFile(path("projects/abs.scx"))
                        .contains("Path=\"" + path("geo/a.obj").toUtf8() + "\""));
        EXPECT_TRUE(QFile::exists(path("geo/a.obj.scx")));
        EXPECT_EQ(SgAppSettings().getString("LastDirectory"), path("projects"));
        EXPECT_EQ(SgAppSettings("TargetImporter").getString("LastDirectory"), path("geo"));
    }
    QFile::remove(path("geo/a.obj.scx"));
    {
        SgTestModalAnswer script(
            {saveOptions(false, true), sgTestChooseFile(path("geo/only.scx"), &directory)});
        save->click();
        EXPECT_EQ(directory, path("projects"));
        EXPECT_TRUE(sgTestReadFile(path("geo/only.scx")).contains("Path=\"/a.obj\""));
        EXPECT_FALSE(QFile::exists(path("geo/a.obj.scx")));
    }
    // A kept folder that is gone opens its nearest existing parent, with no name typed.
    SgAppSettings("TargetImporter").setString("LastDirectory", path("geo/gone/Scenara"));
    QString typed = "unset";
    SgTestModalAnswer script(sgTestChooseFile(QString(), &directory, &typed));
    browse->click();
    EXPECT_EQ(directory, path("geo"));
    EXPECT_EQ(typed, "");
}

TEST_F(MorphLoaderDlgTest, RunThenSecondOkAcceptsOnlyWithoutProblems) {
    // A run with a problem (its file is missing) shows the log; the second "Ok" then rejects.
    // A run without problems ends accepted (test_dialogfit).
    {
        SgMorphLoaderDlg dialog(nullptr, true, nullptr, nullptr);
        dialog.findChild<QComboBox *>("MorphLoaderNodes")->setCurrentIndex(1);
        dialog.sourceList()->addFile(path("missing.obj"));
        dialog.show();
        QPushButton *ok = dialog.buttonBox()->button(QDialogButtonBox::Ok);
        ok->click();
        EXPECT_TRUE(dialog.isVisible());
        EXPECT_FALSE(dialog.buttonBox()->button(QDialogButtonBox::Cancel)->isEnabled());
        EXPECT_EQ(SgAppSettings("TargetImporter").getInt("Nodes", -1), 1);
        EXPECT_EQ(dialog.findChild<QLabel *>("MorphLoaderLogHeading")->text(),
                  "Morphs Loaded, with Warnings or Errors:");
        EXPECT_EQ(sgApp->getMessageSink()->currentStatus(),
                  "Morphs loaded, with warnings or errors.");
        ok->click();
        EXPECT_FALSE(dialog.isVisible());
        EXPECT_EQ(dialog.result(), QDialog::Rejected);
    }
    // The stored index comes back; before a run Escape cancels.
    SgMorphLoaderDlg offered(nullptr, true, nullptr, nullptr);
    EXPECT_EQ(offered.findChild<QComboBox *>("MorphLoaderNodes")->currentIndex(), 1);
    offered.show();
    QTest::keyClick(&offered, Qt::Key_Escape);
    EXPECT_FALSE(offered.isVisible());
    EXPECT_EQ(offered.result(), QDialog::Rejected);
}
