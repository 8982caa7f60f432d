// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

import QtQuick 2.15
import com.marlo.settings.system 1.0
import ".."

/*
    A text file, and the files of a folder as one text.
*/
GalleryPage {
    title: qsTrId("gallery-text-files")
    ready: about.text !== "" && licenses.text !== ""

    Section {
        heading: qsTrId("gallery-text-files-file")

        Paragraph {
            id: about
            textFormat: Text.StyledText
            text: TextFileReader.readContent("/usr/share/marlo-settings/about.html")
        }
        Note {
            text: qsTrId("gallery-text-files-note")
        }
    }

    Section {
        heading: qsTrId("gallery-text-files-folder")

        Paragraph {
            id: licenses
            text: TextFileReader.collate("file:///usr/share/marlo-settings/licenses", "\n\n",
                                         qsTrId("gallery-text-files-prefix") + "\n\n")
        }
    }
}
