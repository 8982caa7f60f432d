// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import com.marlo.settings.system 1.0
import "controls"

/*
    A text file, and the files of a directory joined into one text.
*/
GalleryPage {
    // The languages of the sample files.
    readonly property string language: Qt.locale().name.startsWith("fi") ? "fi" : "en"
    readonly property string about: TextFileReader.readContent(
        "/usr/share/marlo-settings/about-" + language + ".html")
    readonly property string licenses: TextFileReader.collate(
        "file:///usr/share/marlo-settings/licenses/" + language, "\n\n",
        qsTrId("gallery-text-files-prefix") + "\n\n")

    Section {
        heading: qsTrId("gallery-text-files-file")

        Paragraph {
            textFormat: Text.StyledText
            text: about || qsTrId("gallery-text-files-none")
        }
        Note {
            text: qsTrId("gallery-text-files-note")
        }
    }

    Section {
        heading: qsTrId("gallery-text-files-directory")

        Paragraph {
            text: licenses || qsTrId("gallery-text-files-none")
        }
    }
}
