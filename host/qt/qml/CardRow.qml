import QtQuick
import Nimbra.Window

// A way to go on, in a card.
Pressable {
    id: row

    property string detail

    hint: detail
    ringInside: true
    width: parent ? parent.width : 0
    implicitHeight: Math.max(48, label.implicitHeight + 20, aside.implicitHeight + 20)

    Rectangle {
        anchors.fill: parent
        anchors.margins: 3
        radius: Theme.radius - 3
        color: Theme.pressed
        visible: row.isPressed
    }
    Rectangle {
        visible: row.y > 0
        x: Theme.gap
        width: parent.width - 2 * Theme.gap
        height: 1
        color: Theme.line
    }
    Text {
        id: label

        anchors.left: parent.left
        anchors.leftMargin: Theme.gap
        anchors.right: aside.left
        anchors.rightMargin: 8
        anchors.verticalCenter: parent.verticalCenter
        text: row.title
        textFormat: Text.PlainText
        color: row.enabled ? Theme.accent : Theme.faint
        font.pixelSize: Theme.body
        wrapMode: Text.Wrap
        horizontalAlignment: Text.AlignLeft
        Accessible.ignored: true
    }
    Text {
        id: aside

        anchors.right: parent.right
        anchors.rightMargin: Theme.gap
        anchors.verticalCenter: parent.verticalCenter
        width: Math.min(implicitWidth, row.width / 2)
        text: row.detail
        textFormat: Text.PlainText
        color: Theme.faint
        font.pixelSize: Theme.small
        wrapMode: Text.Wrap
        horizontalAlignment: Text.AlignRight
        Accessible.ignored: true
    }
}
