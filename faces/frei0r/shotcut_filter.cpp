#include <frei0r.h>

#include "faces/frei0r/editor_files.h"
#include "text/number_text.h"

namespace velmora::hosts::frei0r {
namespace {

constexpr const char* kPanelImports = R"(import QtQuick 2.12
import QtQuick.Controls 2.12
import QtQuick.Layouts 1.12
import Shotcut.Controls 1.0 as Shotcut

Item {
    property bool isRefreshing: true
    property var allNames: [)";

// Saves the built-in presets among the user's, as Shotcut's own filters do, and leaves the filter at its defaults.
constexpr const char* kPanelFunctions = R"(

    function set(name, value) {
        if (!isRefreshing)
            filter.set(name, value);
    }

    function reset(name, value) {
        filter.set(name, value);
        refresh();
    }

    function savePresets() {
        for (var i = 0; i < builtInPresets.length; i++) {
            for (var j = 0; j < ownNames.length; j++)
                filter.set(ownNames[j], builtInPresets[i][1][j]);
            filter.savePreset(['preset'].concat(ownNames), builtInPresets[i][0]);
        }
    }

    // Earlier projects hold it by number, which MLT prefers.
    function renamePreset() {
        if (filter.get('0') === '')
            return;
        filter.set('preset', filter.get('0'));
        filter.resetProperty('0');
    }

    function refresh() {
        isRefreshing = true;
)";

constexpr const char* kPanelRefreshEnd =
    R"(        control0.currentIndex = Math.max(0, control0.model.indexOf(filter.get('preset')));
        control0.visible = control0.currentIndex > 0;
        isRefreshing = false;
    }

    function setDefaults() {
)";

constexpr const char* kPanelStart = R"(    }

    Component.onCompleted: {
        if (filter.isNew) {
            filter.blockSignals = true;
            filter.set('preset', "none");
            savePresets();
            setDefaults();
            filter.savePreset(allNames);
            filter.blockSignals = false;
            filter.changed();
        } else {
            renamePreset();
        }
        refresh();
    }

    GridLayout {
        anchors.fill: parent
        anchors.margins: 8
        columns: 3

        Label {
            text: qsTr('Preset')
            Layout.alignment: Qt.AlignRight
        }

        Shotcut.Preset {
            Layout.columnSpan: 2
            parameters: allNames
            onPresetSelected: refresh()
        }
)";

constexpr const char* kPanelEnd = R"(
        Item {
            Layout.fillHeight: true
        }
    }
}
)";

// A row of the panel: the declaration of its control, and the code that sets it from the filter.
struct Control {
    std::string declaration;
    std::string refresh;
};

// MLT finds a parameter by number or by name. The first one of a saved preset must be a name: a preset that starts with
// a number is written as a plain list, whose values reach the wrong parameters. The others cannot be names, because
// Shotcut splits the list of properties at spaces.
std::string Property(std::size_t index) {
    return index == 0 ? "'preset'" : "'" + std::to_string(index) + "'";
}

std::string QuotedChoices(std::vector<std::string> choices) {
    for (std::string& choice : choices) choice = Quoted(choice);
    return '[' + Joined(choices, ", ") + ']';
}

Control List(const std::string& id, const std::string& property, const std::vector<std::string>& choices) {
    return {"Shotcut.ComboBox {\n            id: " + id +
                "\n            Layout.fillWidth: true\n            model: " + QuotedChoices(choices) +
                "\n            onActivated: set(" + property + ", model[index])\n        }",
            id + ".currentIndex = Math.max(0, " + id + ".model.indexOf(filter.get(" + property + ")))"};
}

Control CheckBox(const std::string& id, const std::string& property) {
    return {"CheckBox {\n            id: " + id + "\n            onClicked: set(" + property +
                ", checked ? '1' : '0')\n        }",
            id + ".checked = filter.getDouble(" + property + ") >= 0.5"};
}

Control Colour(const std::string& id, const std::string& property) {
    return {"Shotcut.ColorPicker {\n            id: " + id + "\n            onValueChanged: set(" + property +
                ", '' + value)\n        }",
            id + ".value = filter.get(" + property + ")"};
}

Control Number(const std::string& id, const std::string& property) {
    return {"TextField {\n            id: " + id +
                "\n            selectByMouse: true\n            onEditingFinished: set(" + property +
                ", text)\n        }",
            id + ".text = filter.get(" + property + ")"};
}

Control Slider(const std::string& id, const std::string& property, const effects::ParamRow& row) {
    const std::string minimum = NumberText(row.minimum);
    const std::string maximum = NumberText(row.maximum);
    const std::string range = NumberText(double{row.maximum} - row.minimum);
    return {"Shotcut.SliderSpinner {\n            id: " + id + "\n            minimumValue: " + minimum +
                "\n            maximumValue: " + maximum +
                "\n            stepSize: 0.1\n            decimals: 1\n            onValueChanged: set(" +
                property + ", (value - minimumValue) / " + range + ")\n        }",
            id + ".value = Math.round(filter.getDouble(" + property + ") * " + range + " * 1000) / 1000 + (" +
                minimum + ")"};
}

// The list of built-in presets, shown only in a project that uses it: it was in panels before the presets were
// Shotcut's own, and a slider at its default does not override it.
std::string OldPresetRow(const PluginDescription& plugin) {
    const Control list = List("control0", "'preset'", ChoicesOf(plugin, plugin.params[0]));
    return "\n        Label {\n            text: \"Built-in preset\"\n            visible: control0.visible\n"
           "            Layout.alignment: Qt.AlignRight\n        }\n\n        " +
           list.declaration +
           "\n\n        Shotcut.UndoButton {\n            visible: control0.visible\n"
           "            onClicked: reset('preset', \"none\")\n        }\n";
}

// Fills in the start frame and the frame rate, by which a cut in the middle of a clip keeps the damage of the whole clip.
std::string CutButton(const std::string& startFrame, const std::string& frameRate) {
    return "\n        Item {\n            width: 1\n        }\n\n        Shotcut.Button {\n            text: "
           "\"Start frame and rate of this cut\"\n            Layout.columnSpan: 2\n            onClicked: "
           "{\n"
           "                filter.set(" +
           startFrame + ", '' + filter.in);\n                filter.set(" + frameRate +
           ", '' + Math.round(profile.fps * 1000) / 1000);\n                refresh();\n            }\n      "
           "  }\n";
}

// The names and values of the built-in presets, the values in the order of `own`.
std::string PresetData(const PluginDescription& plugin, const std::vector<std::size_t>& own) {
    std::vector<std::string> presets;
    for (std::uint32_t preset = 0; preset < plugin.effect.presetNames.size(); ++preset) {
        std::vector<std::string> values;
        values.reserve(own.size());
        for (const std::size_t i : own) {
            values.push_back(Quoted(PresetValueOf(plugin, preset, plugin.params[i])));
        }
        presets.push_back('[' + Quoted(plugin.effect.presetNames[preset]) + ", [" + Joined(values, ", ") +
                          "]]");
    }
    return "[\n        " + Joined(presets, ",\n        ") + "\n    ]";
}

Control ControlOf(const PluginDescription& plugin, const PluginParam& param, std::size_t index) {
    const std::string id = "control" + std::to_string(index);
    const std::string property = Property(index);
    if (const auto choices = ChoicesOf(plugin, param); !choices.empty()) return List(id, property, choices);
    switch (param.type) {
        case F0R_PARAM_BOOL:
            return CheckBox(id, property);
        case F0R_PARAM_COLOR:
            return Colour(id, property);
        case F0R_PARAM_DOUBLE:
            return Slider(id, property, RowOf(plugin, param));
        default:
            return Number(id, property);
    }
}

}  // namespace

std::string ShotcutMetadata(const PluginDescription& plugin) {
    return "import QtQuick 2.0\nimport org.shotcut.qml 1.0\n\nMetadata {\n    type: Metadata.Filter\n    "
           "objectName: " +
           Quoted(plugin.fileName) + "\n    name: " + Quoted(plugin.name) +
           "\n    keywords: \"film old vintage damage velmora #rgba\"\n    mlt_service: " +
           Quoted("frei0r." + plugin.fileName) + "\n    qml: \"ui.qml\"\n}\n";
}

std::string ShotcutPanel(const PluginDescription& plugin) {
    std::string defaults = "        filter.set('preset', \"none\");\n", refreshes, rows;
    std::vector<std::string> properties, ownProperties;
    std::vector<std::size_t> own;
    for (std::size_t i = 0; i < plugin.params.size(); ++i) properties.push_back(Property(i));
    for (const std::size_t i : PanelOrder(plugin)) {
        const PluginParam& param = plugin.params[i];
        const Control control = ControlOf(plugin, param, i);
        const std::string property = Property(i);
        const std::string setDefault = property + ", " + Quoted(DefaultOf(plugin, param));
        if (param.role == ParamRole::kOwn) {
            own.push_back(i);
            ownProperties.push_back(property);
        }
        defaults += "        filter.set(" + setDefault + ");\n";
        refreshes += "        " + control.refresh + ";\n";
        rows += "\n        Label {\n            text: " + Quoted(LabelOf(param)) +
                "\n            Layout.alignment: Qt.AlignRight\n        }\n\n        " + control.declaration +
                "\n\n        Shotcut.UndoButton {\n            onClicked: reset(" + setDefault +
                ")\n        }\n";
        if (param.role == ParamRole::kFrameRate) rows += CutButton(Property(2), property);
    }
    return kPanelImports + Joined(properties, ", ") + "]\n    property var ownNames: [" +
           Joined(ownProperties, ", ") + "]\n    property var builtInPresets: " + PresetData(plugin, own) +
           "\n    width: 420\n    height: " + std::to_string(36 * (properties.size() + 3)) + kPanelFunctions +
           refreshes + kPanelRefreshEnd + defaults + kPanelStart + OldPresetRow(plugin) + rows + kPanelEnd;
}

}  // namespace velmora::hosts::frei0r
