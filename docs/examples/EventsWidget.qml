import QtQuick 2.15
import QtQuick.Controls 2.15

// The width comes from the home screen, the height from the widget.
Column {
    Label {
        width: parent.width
        //% "Sunny, with a light wind"
        text: qsTrId("weather-widget-forecast")
        wrapMode: Text.Wrap
    }
}
