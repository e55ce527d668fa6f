import QtQuick
import Nimbra.Window

// The sign of a switch; who shows it flips it.
Rectangle {
    id: track

    property bool isOn: false
    property bool isLocked: false

    implicitWidth: 52
    implicitHeight: 32
    radius: height / 2
    color: isOn ? (isLocked ? Theme.edge : Theme.accent) : Theme.card
    border.width: isOn ? 0 : 2
    border.color: Theme.edge
    opacity: isLocked && !Theme.strong ? 0.6 : 1

    Behavior on color {
        enabled: Theme.quick > 0
        ColorAnimation {
            duration: Theme.quick
        }
    }

    Rectangle {
        readonly property real inset: (track.height - height) / 2
        readonly property bool atRight: track.isOn !== texts.rightToLeft

        x: atRight ? track.width - width - inset : inset
        y: inset
        width: track.isOn ? 24 : 18
        height: width
        radius: width / 2
        color: track.isOn ? (track.isLocked ? Theme.card : Theme.accentText) : Theme.edge

        Behavior on x {
            enabled: Theme.quick > 0
            NumberAnimation {
                duration: Theme.quick
                easing.type: Easing.InOutQuad
            }
        }
    }
}
