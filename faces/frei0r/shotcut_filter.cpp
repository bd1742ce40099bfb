#include <frei0r.h>

#include "text/number_text.h"
#include "faces/frei0r/editor_files.h"

namespace velmora::hosts::frei0r {
namespace {

// A row of the panel: the declaration of its control, and the code that sets it from the filter.
struct Control {
    std::string declaration;
    std::string refresh;
};

// Shotcut has its own row "Preset" for presets that users save.
std::string RowLabel(const PluginParam& param) {
    return param.role == ParamRole::kPreset ? "Built-in preset" : LabelOf(param);
}

std::string Property(std::size_t index) {
    return "'" + std::to_string(index) + "'";
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
            id + ".value = filter.getDouble(" + property + ") * " + range + " + (" + minimum + ")"};
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
    std::string defaults, refreshes, rows;
    std::vector<std::string> properties;
    for (std::size_t i = 0; i < plugin.params.size(); ++i) {
        const PluginParam& param = plugin.params[i];
        const Control control = ControlOf(plugin, param, i);
        properties.push_back(Property(i));
        defaults +=
            "            filter.set(" + Property(i) + ", " + Quoted(DefaultOf(plugin, param)) + ");\n";
        refreshes += "        " + control.refresh + ";\n";
        rows += "\n        Label {\n            text: " + Quoted(RowLabel(param)) +
                "\n            Layout.alignment: Qt.AlignRight\n        }\n\n        " + control.declaration +
                "\n\n        Shotcut.UndoButton {\n            onClicked: reset(" + Property(i) + ", " +
                Quoted(DefaultOf(plugin, param)) + ")\n        }\n";
    }
    return "import QtQuick 2.12\nimport QtQuick.Controls 2.12\nimport QtQuick.Layouts 1.12\n"
           "import Shotcut.Controls 1.0 as Shotcut\n\nItem {\n"
           "    property bool isRefreshing: true\n"
           "    property var parameterNames: [" +
           Joined(properties, ", ") +
           "]\n    width: 420\n    height: " + std::to_string(36 * (properties.size() + 2)) +
           "\n\n    function set(name, value) {\n        if (!isRefreshing)\n            filter.set(name, "
           "value);\n    }\n\n"
           "    function reset(name, value) {\n        filter.set(name, value);\n        refresh();\n    "
           "}\n\n"
           "    function refresh() {\n        isRefreshing = true;\n" +
           refreshes +
           "        isRefreshing = false;\n    }\n\n    Component.onCompleted: {\n        if (filter.isNew) "
           "{\n" +
           defaults +
           "            filter.savePreset(parameterNames);\n        }\n        refresh();\n    }\n\n"
           "    GridLayout {\n        anchors.fill: parent\n        anchors.margins: 8\n        columns: "
           "3\n\n"
           "        Label {\n            text: qsTr('Preset')\n            Layout.alignment: Qt.AlignRight\n "
           "       }\n\n"
           "        Shotcut.Preset {\n            Layout.columnSpan: 2\n            parameters: "
           "parameterNames\n"
           "            onPresetSelected: refresh()\n        }\n" +
           rows + "\n        Item {\n            Layout.fillHeight: true\n        }\n    }\n}\n";
}

}  // namespace velmora::hosts::frei0r
