#include "sgcore/io/sgscenefile.h"
#include "sgcore/scene/sgscene.h"

#include <gtest/gtest.h>

TEST(HostSceneFile, RejectsBadFilesWholeWithPlace) {
    SgScene scene;
    SgSceneFile file;
    const QString base = QStringLiteral(SG_EXAMPLES_DIR "/scenes");
    struct Case {
        const char *json;
        const char *words;
    };
    const Case cases[] = {
        {"not json", "not a JSON object"},
        {R"({"nodes": []})", "version 1"},
        {R"({"scenara": 2, "nodes": []})", "version 1"},
        {R"({"scenara": 1, "nodes": [{"kind": "node", "name": "a", "properties": [
            {"type": "color", "name": "c", "value": [0, 255.5, 0]}]}]})",
         "0 to 255"},
        {R"({"scenara": 1, "nodes": [{"kind": "node", "name": "a", "properties": [
            {"type": "float", "name": "p"}, {"type": "float", "name": "q",
             "links": [{"node": "a", "property": "p", "type": 6}]}]}]})",
         "link type from 0 to 5"},
        {R"({"scenara": 1, "nodes": [{"kind": "prop", "name": "a"}]})", "needs \"geometry\""},
        {R"({"scenara": 1, "nodes": [{"kind": "prop", "name": "a", "geometry": "missing.obj"}]})",
         "missing.obj:0: cannot open"},
        {R"({"scenara": 1, "nodes": [{"kind": "node", "name": "a"}, {"kind": "figure", "name": "f",
            "bones": [{"name": "b", "parent": "x"}]}]})",
         "nodes[1].bones[0]: unknown parent bone \"x\""},
        {R"({"scenara": 1, "nodes": [{"kind": "node", "name": "a", "properties": [
            {"type": "float", "name": "p"}, {"type": "int", "name": "p"}]}]})",
         "(82)"},
        {R"({"scenara": 1, "nodes": [{"kind": "figure", "name": "f", "followTarget": "g",
            "bones": []}]})",
         "unknown follow target"},
        {R"({"scenara": 1, "nodes": [{"kind": "prop", "name": "a",
            "geometry": {"file": "figure.obj", "group": "tail"}}]})",
         "no face group \"tail\""},
        {R"({"scenara": 1, "nodes": [{"kind": "node", "name": "a", "origin": [1, 2]}]})",
         "array of 3 numbers"},
    };
    for (const Case &c : cases) {
        EXPECT_FALSE(file.loadFromData(c.json, base, &scene, QStringLiteral("bad.json"))) << c.json;
        EXPECT_TRUE(file.getErrorString().startsWith(QStringLiteral("bad.json: ")))
            << file.getErrorString().toStdString();
        EXPECT_TRUE(file.getErrorString().contains(QString::fromUtf8(c.words)))
            << file.getErrorString().toStdString();
        EXPECT_EQ(scene.getNodeCount(), 0) << "nothing is added from a rejected file";
    }
}
