import QtQuick
import Nimbra.Window

// One line that says what has happened, until it is dismissed.
Rectangle {
    id: notice

    property string text
    signal dismissed

    height: line.active ? line.implicitHeight + 8 : 0
    visible: text !== ""
    color: Theme.page

    Loader {
        id: line

        anchors.fill: parent
        active: notice.text !== ""
        sourceComponent: Item {
            implicitHeight: Math.max(Theme.touch, label.implicitHeight + 16)

            Rectangle {
                anchors.fill: parent
                anchors.margins: 4
                radius: Theme.radius
                color: Theme.dark ? "#2d2d34" : "#e4eaf4"
                border.width: Theme.strong ? 2 : 0
                border.color: Theme.text
            }
            Text {
                id: label

                anchors.left: parent.left
                anchors.leftMargin: Theme.gap
                anchors.right: closeButton.left
                anchors.rightMargin: 8
                anchors.verticalCenter: parent.verticalCenter
                text: notice.text
                textFormat: Text.PlainText
                color: Theme.text
                font.pixelSize: Theme.small + 1
                wrapMode: Text.Wrap
                horizontalAlignment: Text.AlignLeft
                Accessible.role: Accessible.AlertMessage
                Accessible.name: text
            }
            PushButton {
                id: closeButton

                objectName: "dismiss"
                anchors.right: parent.right
                anchors.rightMargin: 6
                anchors.verticalCenter: parent.verticalCenter
                title: texts.text("dismiss")
                ringInside: true
                font.pixelSize: Theme.small + 1
                onPressed: notice.dismissed()
            }
        }
    }
}
