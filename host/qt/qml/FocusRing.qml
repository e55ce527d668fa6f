import QtQuick
import Nimbra.Window

// Shows where the keyboard is.
Rectangle {
    property Item around
    property bool inset: false

    anchors.fill: around
    anchors.margins: inset ? 2 : -3
    visible: around.activeFocus
    color: "transparent"
    radius: Theme.radius
    border.color: Theme.accent
    border.width: Theme.strong ? 4 : 3
    z: 10
}
