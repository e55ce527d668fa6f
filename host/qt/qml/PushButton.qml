import QtQuick
import Nimbra.Window

// A title that does something.
Pressable {
    id: button

    // The one that is most likely meant.
    property bool isMain: false
    property bool isFilled: false
    property alias font: label.font

    implicitWidth: Math.max(Theme.touch, label.implicitWidth + 2 * Theme.gap)
    implicitHeight: Math.max(Theme.touch, label.implicitHeight + 16)

    Rectangle {
        anchors.fill: parent
        radius: Theme.radius
        color: button.isFilled ? (button.enabled ? Theme.accent : Theme.line) : (button.isPressed ? Theme.pressed : "transparent")
        opacity: button.isFilled && button.isPressed ? 0.8 : 1
    }

    Text {
        id: label

        anchors.fill: parent
        anchors.leftMargin: 8
        anchors.rightMargin: 8
        text: button.title
        textFormat: Text.PlainText
        color: !button.enabled ? Theme.faint : (button.isFilled ? Theme.accentText : Theme.accent)
        font.pixelSize: Theme.body
        font.weight: button.isMain ? Font.DemiBold : Font.Normal
        horizontalAlignment: Text.AlignHCenter
        verticalAlignment: Text.AlignVCenter
        wrapMode: Text.Wrap
    }
}
