<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="en">
<context>
    <name></name>
    <message id="settings_location-la-no_agreement_text_found">
        <source>The terms of this service could not be found.</source>
        <extracomment>Shown instead of the consent text of a location service whose file cannot be read.</extracomment>
        <translation>The terms of this service could not be found.</translation>
    </message>
</context>
</TS>
