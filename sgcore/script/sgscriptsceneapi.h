#pragma once

#include <QObject>
#include <QString>

class SgNode;

// The `scene` object of host scripts (see SgScript and examples/poses/README.md): the calls a
// pose file uses to put the application's scene into a pose. Nodes are named by their name or,
// failing that, their label; the first match in scene order wins. Every call returns false
// when its node (or property, or morph) is not found, or a value is not a finite number.
class SgScriptSceneApi : public QObject {
    Q_OBJECT
public:
    explicit SgScriptSceneApi(QObject *parent = nullptr);

    // Sets the node's local rotation from Euler angles in degrees (about Z, then X, then Y).
    Q_INVOKABLE bool setRotation(const QString &node, double x, double y, double z);
    // Sets the node's local rotation to the quaternion (x, y, z, w), normalised.
    Q_INVOKABLE bool setRotationQuat(const QString &node, double x, double y, double z, double w);
    // Sets the raw value of the node's numeric property named (or labelled) `property`.
    Q_INVOKABLE bool setValue(const QString &node, const QString &property, double value);
    // Sets the raw value of the value channel of the morph named `morph` on the node's object.
    Q_INVOKABLE bool setMorph(const QString &node, const QString &morph, double value);
    // Clears the rotation of the node and, for a figure, of all its bones.
    Q_INVOKABLE bool resetPose(const QString &node);
    // Writes `text` to the host log.
    Q_INVOKABLE void print(const QString &text);

    // The node a script names, or null.
    static SgNode *findNode(const QString &name);
    // Writes to the host log when there is an application.
    static void log(const QString &text);
};
