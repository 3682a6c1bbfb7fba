// The headless demonstration: sends the example figure to the reference modeler, which applies
// its scripted edit and sends the figure straight back; the application turns the returned
// geometry into a morph on every bone that moved, driven by one control property on the
// figure. The script prints a summary and writes the figure, morph at 1, as OBJ.
//
// Usage: scenara --script send-figure.js -- SCENE.json OUTPUT_FOLDER [FIGURE_LABEL]

var sceneFile = app.arguments[0];
var outFolder = app.arguments[1];
if (!sceneFile || !outFolder)
    throw new Error("usage: scenara --script send-figure.js -- SCENE.json OUTPUT_FOLDER");
if (!scene.load(sceneFile))
    throw new Error("cannot load the scene: " + scene.lastError());

var figure = app.arguments[2] || scene.figures()[0];
if (!selection.select(figure))
    throw new Error("no figure labelled " + figure);

var bridge = app.action("Send to Facetor...");
if (!bridge)
    throw new Error("the Facetor Bridge plug-in is not loaded (actions: " + app.actionNames() + ")");

app.print("== Sending " + figure + " to Facetor");
bridge.trigger();

app.waitForBridge(bridge, 30000, function (outcome) {
    app.print("== Bridge: " + outcome);
    if (outcome === "timeout")
        throw new Error("the modeler did not return the figure in time");

    var info = scene.node(figure);
    var control = null;
    info.properties.forEach(function (p) {
        if (p.owner === info.name && p.name === "MyMorph")
            control = p;
    });

    app.print("== Summary");
    var morphs = 0;
    info.bones.forEach(function (bone) {
        var node = scene.node(bone);
        node.modifiers.forEach(function (m) {
            if (!m.morph)
                return;
            morphs++;
            app.print("  morph " + m.name + " on bone " + bone + ": " + m.deltas + " deltas, label "
                      + m.label + (m.hidden ? " (hidden)" : "") + ", value " + m.value.toFixed(3));
        });
    });
    app.print("  morphs created: " + morphs);
    if (control)
        app.print("  control property " + control.name + " on " + figure + ": value " + control.value
                  + ", range " + control.min + " to " + control.max
                  + (control.clamped ? " (clamped)" : "") + ", group \"" + control.path + "\"");
    else
        app.print("  no control property was made");

    var out = outFolder + "/" + figure + "-morphed.obj";
    if (!app.exportObj(figure, out))
        throw new Error("could not write " + out);
    app.print("== Wrote " + out);
    // The whole scene with the new morphs and their control property, to open in the window.
    var saved = outFolder + "/" + figure + "-scene.json";
    if (!scene.save(saved))
        throw new Error("could not save " + saved + ": " + scene.lastError());
    app.print("== Saved " + saved);
    if (morphs === 0)
        app.fail("no morph was created");
});
