import QtQuick
import Nimbra.Window

// An arrow that comes round.
Item {
    id: mark

    property color color: Theme.accent
    property color ground: Theme.page

    implicitWidth: 22
    implicitHeight: 22

    Rectangle {
        anchors.fill: parent
        anchors.margins: 2
        radius: width / 2
        color: "transparent"
        border.width: 2
        border.color: mark.color
    }
    Rectangle {
        x: 12
        y: 0
        width: 9
        height: 9
        color: mark.ground
    }
    Rectangle {
        x: 9.5
        y: 0.2
        width: 8
        height: 2
        radius: 1
        color: mark.color
        antialiasing: true
        rotation: 45
    }
    Rectangle {
        x: 9.5
        y: 4.8
        width: 8
        height: 2
        radius: 1
        color: mark.color
        antialiasing: true
        rotation: -45
    }
}
