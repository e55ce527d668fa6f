import QtQuick
import Nimbra.Window

// Stands over all else and keeps the focus while it is shown.
FocusScope {
    id: sheet

    property bool isShown: false
    property real sheetWidth: 320
    property real sheetHeight: body.implicitHeight
    // Where it stands: in the middle, or at the bottom of a narrow window.
    property bool isAtBottom: false
    property string title
    default property alias content: body.data
    property alias body: body
    signal escaped

    anchors.fill: parent
    visible: isShown || fade.running
    enabled: isShown
    opacity: isShown ? 1 : 0
    Accessible.role: Accessible.Dialog
    Accessible.name: title

    Behavior on opacity {
        enabled: Theme.quick > 0
        NumberAnimation {
            id: fade

            duration: Theme.quick
        }
    }

    Keys.onEscapePressed: escaped()

    Rectangle {
        anchors.fill: parent
        color: Theme.shade

        MouseArea {
            anchors.fill: parent
            hoverEnabled: true
            onWheel: wheel => wheel.accepted = true
            onClicked: {
                if (sheet.isAtBottom)
                    sheet.escaped();
            }
        }
    }

    Rectangle {
        id: card

        readonly property bool coversAll: width >= sheet.width && height >= sheet.height

        anchors.horizontalCenter: parent.horizontalCenter
        y: sheet.isAtBottom ? parent.height - height + 16 : Math.max(0, (parent.height - height) / 2)
        width: Math.min(sheet.sheetWidth, parent.width)
        height: Math.min(sheet.sheetHeight + (sheet.isAtBottom ? 16 : 0), parent.height)
        radius: coversAll ? 0 : 16
        color: Theme.dark ? Theme.card : (Theme.strong ? "#ffffff" : "#f9f9fb")
        border.width: Theme.strong ? 2 : 0
        border.color: Theme.line
        clip: true

        MouseArea {
            anchors.fill: parent
        }
        Item {
            id: body

            width: parent.width
            height: sheet.sheetHeight > sheet.height ? sheet.height : sheet.sheetHeight
        }
    }
}
