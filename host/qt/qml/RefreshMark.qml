import QtQuick
import Nimbra.Window

// An arrow that comes round.
Item {
    id: mark

    property color color: Theme.accent
    property color ground: Theme.page

    implicitWidth: 22 * Theme.symbol
    implicitHeight: 22 * Theme.symbol

    Rectangle {
        anchors.fill: parent
        anchors.margins: 2 * Theme.symbol
        radius: width / 2
        color: "transparent"
        border.width: 2 * Theme.symbol
        border.color: mark.color
    }
    Rectangle {
        x: 12 * Theme.symbol
        y: 0
        width: 9 * Theme.symbol
        height: 9 * Theme.symbol
        color: mark.ground
    }
    Rectangle {
        x: 9.5 * Theme.symbol
        y: 0.2 * Theme.symbol
        width: 8 * Theme.symbol
        height: 2 * Theme.symbol
        radius: height / 2
        color: mark.color
        antialiasing: true
        rotation: 45
    }
    Rectangle {
        x: 9.5 * Theme.symbol
        y: 4.8 * Theme.symbol
        width: 8 * Theme.symbol
        height: 2 * Theme.symbol
        radius: height / 2
        color: mark.color
        antialiasing: true
        rotation: -45
    }
}
