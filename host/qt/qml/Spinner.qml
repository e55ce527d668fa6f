import QtQuick
import Nimbra.Window

// Turns while something is under way; stands still where motion is not wanted.
Item {
    id: spinner

    property bool running: true
    property color color: Theme.faint

    implicitWidth: 24
    implicitHeight: 24
    visible: running
    Accessible.ignored: true

    Repeater {
        model: 8

        Rectangle {
            required property int index
            readonly property real angle: index * Math.PI / 4

            x: spinner.width / 2 - width / 2 + Math.cos(angle) * spinner.width * 0.38
            y: spinner.height / 2 - height / 2 + Math.sin(angle) * spinner.height * 0.38
            width: Math.max(2, spinner.width / 7)
            height: width
            radius: width / 2
            color: spinner.color
            opacity: 0.2 + 0.1 * index
        }
    }

    RotationAnimator on rotation {
        from: 0
        to: 360
        duration: 1000
        loops: Animation.Infinite
        running: spinner.running && spinner.visible && !appearance.reducedMotion
    }
}
