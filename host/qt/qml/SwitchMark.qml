import QtQuick
import Nimbra.Window

// The sign of a switch; who shows it flips it.
Rectangle {
    id: track

    property bool isOn: false
    property bool isLocked: false
    // From off, 0, to on, 1.
    property real position: isOn ? 1 : 0
    readonly property color off: Theme.card
    readonly property color on: isLocked ? Theme.edge : Theme.accent

    implicitWidth: 52
    implicitHeight: 32
    radius: height / 2
    color: position === 0 ? off : (position === 1 ? on : Qt.rgba(off.r + (on.r - off.r) * position, off.g + (on.g - off.g) * position, off.b + (on.b - off.b) * position, 1))
    border.width: isOn ? 0 : 2
    border.color: Theme.edge
    opacity: isLocked && !Theme.strong ? 0.6 : 1

    Behavior on position {
        enabled: Theme.quick > 0
        NumberAnimation {
            duration: Theme.quick
            easing.type: Easing.InOutQuad
        }
    }

    Rectangle {
        readonly property real inset: (track.height - height) / 2
        readonly property real way: track.width - width - 2 * inset

        x: inset + way * (texts.rightToLeft ? 1 - track.position : track.position)
        y: inset
        width: 18 + 6 * track.position
        height: width
        radius: width / 2
        color: track.isOn ? (track.isLocked ? Theme.card : Theme.accentText) : Theme.edge
    }
}
