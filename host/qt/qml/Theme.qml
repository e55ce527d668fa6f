pragma Singleton
import QtQuick
import Nimbra.Window

// Colours and measures of the window. Texts stand out from what is behind them by 4.5 to 1 at
// least, in high contrast by 7 to 1.
QtObject {
    readonly property bool dark: appearance.dark
    readonly property bool strong: appearance.highContrast
    readonly property real scale: appearance.textScale

    readonly property color page: dark ? (strong ? "#000000" : "#111114") : (strong ? "#ffffff" : "#f2f2f6")
    readonly property color card: dark ? (strong ? "#000000" : "#1e1e22") : "#ffffff"
    readonly property color pressed: dark ? "#34343a" : "#e3e3ea"
    readonly property color lit: dark ? "#23374f" : "#d3e4fa"
    readonly property color text: dark ? (strong ? "#ffffff" : "#f3f3f5") : (strong ? "#000000" : "#1b1b1f")
    readonly property color faint: dark ? (strong ? "#ffffff" : "#a9a9b2") : (strong ? "#000000" : "#5c5c66")
    readonly property color accent: dark ? (strong ? "#9fceff" : "#72b4ff") : (strong ? "#003f8f" : "#0a5fc4")
    readonly property color accentText: dark ? "#06213f" : "#ffffff"
    readonly property color failure: dark ? "#ff9c94" : "#b3261e"
    readonly property color line: strong ? text : (dark ? "#36363c" : "#dcdce2")
    // What bounds a control: 3 to 1 at least.
    readonly property color edge: strong ? text : (dark ? "#7b7b85" : "#85858f")
    readonly property color shade: dark ? "#a0000000" : "#66000000"

    readonly property real body: Math.round(17 * scale)
    readonly property real small: Math.round(13 * scale)
    // Symbols grow with the texts beside them, as far as what can be touched has room for them; the
    // lock, which stands before a switch, does not, as the switch does not.
    readonly property real symbol: Math.max(1, Math.min(scale, 1.5))

    readonly property real gap: 16
    readonly property real radius: 12
    // The least height and width of what can be touched.
    readonly property real touch: 44
    // Wider, a column is hard to read.
    readonly property real widestColumn: 640

    readonly property int quick: appearance.reducedMotion ? 0 : 150
    readonly property int calm: appearance.reducedMotion ? 0 : 250
}
