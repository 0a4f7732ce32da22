<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="de" sourcelanguage="en">
<context>
    <name>Codecs</name>
    <message>
        <source>timed text</source>
        <translation>Zeittext</translation>
    </message>
    <message>
        <source>plain text</source>
        <translation>reiner Text</translation>
    </message>
    <message>
        <source>uncompressed</source>
        <translation>unkomprimiert</translation>
    </message>
    <message>
        <source>mono</source>
        <translation>Mono</translation>
    </message>
    <message>
        <source>stereo</source>
        <translation>Stereo</translation>
    </message>
</context>
<context>
    <name>ConvertRunner</name>
    <message>
        <source>There was not enough memory.</source>
        <translation>Der Arbeitsspeicher reichte nicht.</translation>
    </message>
    <message>
        <source>Choose another name, or let it be replaced.</source>
        <translation>Einen anderen Namen wählen oder die Datei ersetzen lassen.</translation>
    </message>
    <message>
        <source>Make room on the disk, or choose another folder.</source>
        <translation>Platz auf dem Datenträger schaffen oder einen anderen Ordner wählen.</translation>
    </message>
    <message>
        <source>Choose another folder that you may write to.</source>
        <translation>Einen anderen Ordner wählen, in den geschrieben werden darf.</translation>
    </message>
    <message>
        <source>It was stopped before anything was converted.</source>
        <translation>Es wurde abgebrochen, bevor etwas umgewandelt war.</translation>
    </message>
    <message>
        <source>Is the disk that holds it connected?</source>
        <translation>Ist der Datenträger angeschlossen, auf dem er liegt?</translation>
    </message>
</context>
<context>
    <name>Foresight</name>
    <message>
        <source>The new file cannot take the place of its source. Choose another name.</source>
        <translation>Die neue Datei kann nicht an die Stelle ihrer Quelle treten. Bitte einen anderen Namen wählen.</translation>
    </message>
    <message>
        <source>There is a file of this name already.</source>
        <translation>Eine Datei dieses Namens gibt es schon.</translation>
    </message>
    <message>
        <source>The file that exists will be replaced.</source>
        <translation>Die vorhandene Datei wird ersetzt.</translation>
    </message>
    <message>
        <source>The subtitles “%1” were not found.</source>
        <translation>Die Untertitel „%1“ wurden nicht gefunden.</translation>
    </message>
    <message>
        <source>The sound stays as it is, and so do its channels.</source>
        <translation>Der Ton bleibt unverändert, und mit ihm seine Kanäle.</translation>
    </message>
    <message>
        <source>Without pictures, no subtitles are drawn.</source>
        <translation>Ohne Bilder werden keine Untertitel gezeichnet.</translation>
    </message>
    <message>
        <source>Not carried over:</source>
        <translation>Nicht übernommen:</translation>
    </message>
    <message>
        <source>About %1 are needed, but only %2 are free in “%3”.</source>
        <translation>Etwa %1 werden gebraucht, aber nur %2 sind in „%3“ frei.</translation>
    </message>
    <message>
        <source>There is no folder “%1”.</source>
        <translation>Den Ordner „%1“ gibt es nicht.</translation>
    </message>
    <message>
        <source>You may not write to the folder “%1”.</source>
        <translation>In den Ordner „%1“ darf nicht geschrieben werden.</translation>
    </message>
    <message>
        <source>There is a file “%1” already.</source>
        <translation>Eine Datei „%1“ gibt es schon.</translation>
    </message>
</context>
<context>
    <name>FormParts</name>
    <message>
        <source>Subtitles</source>
        <translation>Untertitel</translation>
    </message>
    <message>
        <source>All files</source>
        <translation>Alle Dateien</translation>
    </message>
</context>
<context>
    <name>Intake</name>
    <message>
        <source>There are no movies in the folder “%1”.</source>
        <translation>Im Ordner „%1“ sind keine Filme.</translation>
    </message>
    <message>
        <source>“%1” is neither a file nor a folder.</source>
        <translation>„%1“ ist weder Datei noch Ordner.</translation>
    </message>
    <message>
        <source>“%1” was not found.</source>
        <translation>„%1“ wurde nicht gefunden.</translation>
    </message>
</context>
<context>
    <name>Journal</name>
    <message>
        <source>The saved queue could not be read. It was kept as %1.</source>
        <translation>Die gespeicherte Warteschlange war nicht lesbar. Sie wurde als %1 aufgehoben.</translation>
    </message>
    <message>
        <source>The queue cannot be saved in %1: %2. It will be lost when the program ends.</source>
        <translation>Die Warteschlange kann nicht in %1 gespeichert werden: %2. Sie geht mit dem Ende des Programms verloren.</translation>
    </message>
    <message>
        <source>Another window has the saved queue. What is added here is lost when this one is closed.</source>
        <translation>Die gespeicherte Warteschlange gehört einem anderen Fenster. Was hier hinzukommt, geht verloren, wenn dieses geschlossen wird.</translation>
    </message>
</context>
<context>
    <name>Languages</name>
    <message>
        <source>Arabic</source>
        <translation>Arabisch</translation>
    </message>
    <message>
        <source>Bulgarian</source>
        <translation>Bulgarisch</translation>
    </message>
    <message>
        <source>Catalan</source>
        <translation>Katalanisch</translation>
    </message>
    <message>
        <source>Czech</source>
        <translation>Tschechisch</translation>
    </message>
    <message>
        <source>Danish</source>
        <translation>Dänisch</translation>
    </message>
    <message>
        <source>German</source>
        <translation>Deutsch</translation>
    </message>
    <message>
        <source>Greek</source>
        <translation>Griechisch</translation>
    </message>
    <message>
        <source>English</source>
        <translation>Englisch</translation>
    </message>
    <message>
        <source>Spanish</source>
        <translation>Spanisch</translation>
    </message>
    <message>
        <source>Estonian</source>
        <translation>Estnisch</translation>
    </message>
    <message>
        <source>Persian</source>
        <translation>Persisch</translation>
    </message>
    <message>
        <source>Finnish</source>
        <translation>Finnisch</translation>
    </message>
    <message>
        <source>French</source>
        <translation>Französisch</translation>
    </message>
    <message>
        <source>Hebrew</source>
        <translation>Hebräisch</translation>
    </message>
    <message>
        <source>Hindi</source>
        <translation>Hindi</translation>
    </message>
    <message>
        <source>Croatian</source>
        <translation>Kroatisch</translation>
    </message>
    <message>
        <source>Hungarian</source>
        <translation>Ungarisch</translation>
    </message>
    <message>
        <source>Indonesian</source>
        <translation>Indonesisch</translation>
    </message>
    <message>
        <source>Italian</source>
        <translation>Italienisch</translation>
    </message>
    <message>
        <source>Japanese</source>
        <translation>Japanisch</translation>
    </message>
    <message>
        <source>Korean</source>
        <translation>Koreanisch</translation>
    </message>
    <message>
        <source>Lithuanian</source>
        <translation>Litauisch</translation>
    </message>
    <message>
        <source>Latvian</source>
        <translation>Lettisch</translation>
    </message>
    <message>
        <source>Dutch</source>
        <translation>Niederländisch</translation>
    </message>
    <message>
        <source>Norwegian</source>
        <translation>Norwegisch</translation>
    </message>
    <message>
        <source>Polish</source>
        <translation>Polnisch</translation>
    </message>
    <message>
        <source>Portuguese</source>
        <translation>Portugiesisch</translation>
    </message>
    <message>
        <source>Romanian</source>
        <translation>Rumänisch</translation>
    </message>
    <message>
        <source>Russian</source>
        <translation>Russisch</translation>
    </message>
    <message>
        <source>Slovak</source>
        <translation>Slowakisch</translation>
    </message>
    <message>
        <source>Slovenian</source>
        <translation>Slowenisch</translation>
    </message>
    <message>
        <source>Serbian</source>
        <translation>Serbisch</translation>
    </message>
    <message>
        <source>Swedish</source>
        <translation>Schwedisch</translation>
    </message>
    <message>
        <source>Thai</source>
        <translation>Thailändisch</translation>
    </message>
    <message>
        <source>Turkish</source>
        <translation>Türkisch</translation>
    </message>
    <message>
        <source>Ukrainian</source>
        <translation>Ukrainisch</translation>
    </message>
    <message>
        <source>Vietnamese</source>
        <translation>Vietnamesisch</translation>
    </message>
    <message>
        <source>Chinese</source>
        <translation>Chinesisch</translation>
    </message>
</context>
<context>
    <name>Library</name>
    <message>
        <source>{} cannot hold them</source>
        <translation>{} kann sie nicht aufnehmen</translation>
    </message>
    <message>
        <source>{} cannot hold them, MKV can</source>
        <translation>{} kann sie nicht aufnehmen, MKV kann es</translation>
    </message>
    <message>
        <source>{} cannot hold it</source>
        <translation>{} kann das nicht aufnehmen</translation>
    </message>
    <message>
        <source>{} holds one track of sound, MKV and MP4 hold several</source>
        <translation>{} hat eine Tonspur, MKV und MP4 haben mehrere</translation>
    </message>
    <message>
        <source>{} of them have no length</source>
        <translation>{} davon haben keine Länge</translation>
    </message>
    <message>
        <source>it cannot be decoded</source>
        <translation>lässt sich nicht dekodieren</translation>
    </message>
    <message>
        <source>it belongs to another programme</source>
        <translation>gehört zu einem anderen Programm</translation>
    </message>
    <message>
        <source>one stream of pictures is converted</source>
        <translation>nur eine Bildspur wird umgewandelt</translation>
    </message>
    <message>
        <source>data streams are not converted</source>
        <translation>Datenspuren werden nicht umgewandelt</translation>
    </message>
    <message>
        <source>only one cover is carried</source>
        <translation>nur ein Titelbild wird übernommen</translation>
    </message>
    <message>
        <source>it is neither JPEG nor PNG</source>
        <translation>ist weder JPEG noch PNG</translation>
    </message>
    <message>
        <source>it has no name or no content</source>
        <translation>hat keinen Namen oder keinen Inhalt</translation>
    </message>
    <message>
        <source>pictures</source>
        <translation>Bilder</translation>
    </message>
    <message>
        <source>sound</source>
        <translation>Ton</translation>
    </message>
    <message>
        <source>subtitles</source>
        <translation>Untertitel</translation>
    </message>
    <message>
        <source>chapters</source>
        <translation>Kapitel</translation>
    </message>
    <message>
        <source>cover</source>
        <translation>Titelbild</translation>
    </message>
    <message>
        <source>attachment</source>
        <translation>Anhang</translation>
    </message>
    <message>
        <source>data</source>
        <translation>Daten</translation>
    </message>
    <message>
        <source>{} cannot hold it as it is</source>
        <translation>{} kann ihn nicht unverändert aufnehmen</translation>
    </message>
    <message>
        <source>{} cannot hold its {}</source>
        <translation>{} kann davon nicht aufnehmen: {}</translation>
    </message>
    <message>
        <source>{} cannot hold one of {} bytes</source>
        <translation>{} kann keines von {} Byte aufnehmen</translation>
    </message>
    <message>
        <source>{} cannot hold &quot;{}&quot; sound as it is; no format can</source>
        <translation>{} kann Ton in „{}“ nicht unverändert aufnehmen, und kein anderes Format kann es</translation>
    </message>
    <message>
        <source>{} cannot hold &quot;{}&quot; sound as it is; {} can</source>
        <translation>{} kann Ton in „{}“ nicht unverändert aufnehmen; diese können es: {}</translation>
    </message>
    <message>
        <source>{} cannot hold short frames of &quot;{}&quot; sound as it is; MKV can</source>
        <translation>{} kann kurze Blöcke von Ton „{}“ nicht unverändert enthalten; MKV kann es</translation>
    </message>
    <message>
        <source>{} cannot begin the sound as it is {:.1f} s behind the pictures; MKV can</source>
        <translation>{} kann unveränderten Ton nicht {} s nach den Bildern beginnen lassen; MKV kann es</translation>
    </message>
    <message>
        <source>{} cannot carry pictures as &quot;{}&quot;</source>
        <translation>{} kann keine Bilder in „{}“ aufnehmen</translation>
    </message>
    <message>
        <source>{} cannot carry sound as &quot;{}&quot;</source>
        <translation>{} kann keinen Ton in „{}“ aufnehmen</translation>
    </message>
    <message>
        <source>{} carries nothing that &quot;{}&quot; holds; choose another format</source>
        <translation>{} kann nichts von dem aufnehmen, was in „{}“ ist; bitte ein anderes Format wählen</translation>
    </message>
    <message>
        <source>the extension of &quot;{}&quot; tells no file format</source>
        <translation>die Endung von „{}“ nennt kein Dateiformat</translation>
    </message>
    <message>
        <source>the begin, {:.3f} s, is not before the end of &quot;{}&quot;, which is {:.3f} s long</source>
        <translation>der Anfang, {} s, liegt nicht vor dem Ende von „{}“, das {} s lang ist</translation>
    </message>
    <message>
        <source>&quot;{}&quot; has pictures of {} bits; HEVC, VP90 and AV01 have some of 10</source>
        <translation>„{}“ hat Bilder mit {} Bit; HEVC, VP90 und AV01 haben welche mit 10</translation>
    </message>
    <message>
        <source>HDR needs pictures of 10 bits; &quot;{}&quot; has 8 here</source>
        <translation>HDR braucht Bilder mit 10 Bit; „{}“ hat hier 8</translation>
    </message>
    <message>
        <source>there is no sound &quot;{}&quot;; there is: {}</source>
        <translation>es gibt keinen Ton „{}“; es gibt: {}</translation>
    </message>
    <message>
        <source>there are no subtitles &quot;{}&quot;; there are: {}</source>
        <translation>es gibt keine Untertitel „{}“; es gibt: {}</translation>
    </message>
    <message>
        <source>the subtitles &quot;{}&quot; cannot be decoded</source>
        <translation>die Untertitel „{}“ können nicht decodiert werden</translation>
    </message>
    <message>
        <source>&quot;{}&quot; does not tell how long it is</source>
        <translation>„{}“ sagt nicht, wie lang es ist</translation>
    </message>
    <message>
        <source>&quot;{}&quot; is a folder; name a file in it</source>
        <translation>„{}“ ist ein Ordner; bitte eine Datei darin nennen</translation>
    </message>
    <message>
        <source>&quot;{}&quot; is not a file but a device or a pipe; name a file</source>
        <translation>„{}“ ist keine Datei, sondern ein Gerät oder eine Pipe; bitte eine Datei nennen</translation>
    </message>
    <message>
        <source>&quot;{}&quot; is not a folder</source>
        <translation>„{}“ ist kein Ordner</translation>
    </message>
    <message>
        <source>&quot;{}&quot; exists</source>
        <translation>„{}“ gibt es schon</translation>
    </message>
    <message>
        <source>the output&apos;s folder &quot;{}&quot; cannot be used: {}</source>
        <translation>der Zielordner „{}“ ist nicht zu gebrauchen: {}</translation>
    </message>
    <message>
        <source>cannot create files in &quot;{}&quot;: {}; choose another folder</source>
        <translation>in „{}“ lassen sich keine Dateien anlegen: {}; bitte einen anderen Ordner wählen</translation>
    </message>
    <message>
        <source>&quot;{}&quot; holds nothing to convert</source>
        <translation>in „{}“ ist nichts, was sich umwandeln lässt</translation>
    </message>
    <message>
        <source>cannot open &quot;{}&quot;: {}</source>
        <translation>„{}“ lässt sich nicht öffnen: {}</translation>
    </message>
    <message>
        <source>cannot read &quot;{}&quot;: {}</source>
        <translation>„{}“ lässt sich nicht lesen: {}</translation>
    </message>
    <message>
        <source>cannot read the streams of &quot;{}&quot;: {}</source>
        <translation>die Spuren von „{}“ lassen sich nicht lesen: {}</translation>
    </message>
    <message>
        <source>it is a text, not a movie</source>
        <translation>es ist ein Text und kein Film</translation>
    </message>
    <message>
        <source>it is not a movie, but says where to find one</source>
        <translation>es ist kein Film, sondern sagt, wo einer zu finden ist</translation>
    </message>
    <message>
        <source>it asks for more memory than there is</source>
        <translation>es verlangt mehr Speicher, als da ist</translation>
    </message>
    <message>
        <source>it is a playlist, which names other files</source>
        <translation>es ist eine Abspielliste, die andere Dateien nennt</translation>
    </message>
    <message>
        <source>&quot;{}&quot; has changed meanwhile</source>
        <translation>„{}“ hat sich inzwischen geändert</translation>
    </message>
    <message>
        <source>reading &quot;{}&quot; failed after {}: {}; what was read is converted</source>
        <translation>„{}“ war nur bis {} zu lesen: {}; was gelesen wurde, ist umgewandelt</translation>
    </message>
    <message>
        <source>reading &quot;{}&quot; failed after {}: {}</source>
        <translation>„{}“ war nur bis {} zu lesen: {}</translation>
    </message>
    <message>
        <source>the conversion broke off after {}</source>
        <translation>die Umwandlung brach nach {} ab</translation>
    </message>
    <message>
        <source>cannot write &quot;{}&quot;: {}; what was written so far is in &quot;{}&quot;</source>
        <translation>„{}“ lässt sich nicht schreiben: {}; was bisher geschrieben wurde, ist in „{}“</translation>
    </message>
    <message>
        <source>cannot write &quot;{}&quot;: {}</source>
        <translation>„{}“ lässt sich nicht schreiben: {}</translation>
    </message>
    <message>
        <source>&quot;{}&quot; vanished while it was written: {}</source>
        <translation>„{}“ verschwand, während es geschrieben wurde: {}</translation>
    </message>
    <message>
        <source>&quot;{}&quot; was written but stands there no more: it vanished meanwhile</source>
        <translation>„{}“ wurde geschrieben, ist aber inzwischen verschwunden</translation>
    </message>
    <message>
        <source>&quot;{}&quot; was written, but another file stands there now</source>
        <translation>„{}“ wurde geschrieben, aber jetzt liegt dort eine andere Datei</translation>
    </message>
    <message>
        <source>&quot;{}&quot; needs about {}, but only {} are free</source>
        <translation>„{}“ braucht etwa {}, aber nur {} sind frei</translation>
    </message>
    <message>
        <source>no space is left for &quot;{}&quot;; waiting until there is room for {}</source>
        <translation>für „{}“ ist kein Platz mehr; es wird gewartet, bis Platz für {} ist</translation>
    </message>
    <message>
        <source>no black borders were found</source>
        <translation>schwarze Ränder wurden nicht gefunden</translation>
    </message>
    <message>
        <source>black borders cannot be looked for in a pipe</source>
        <translation>in einer Pipe kann nicht nach schwarzen Rändern gesucht werden</translation>
    </message>
    <message>
        <source>{} cannot hold {}</source>
        <translation>{} kann nicht aufnehmen: {}</translation>
    </message>
    <message>
        <source>tags</source>
        <translation>Texte</translation>
    </message>
    <message>
        <source>label</source>
        <translation>Beschriftung</translation>
    </message>
    <message>
        <source>language</source>
        <translation>Sprache</translation>
    </message>
    <message>
        <source>title</source>
        <translation>Titel</translation>
    </message>
    <message>
        <source>flags</source>
        <translation>Merkmale</translation>
    </message>
    <message>
        <source>%1 and %2</source>
        <comment>the last two of a list</comment>
        <translation>%1 und %2</translation>
    </message>
    <message>
        <source>it belongs to the pictures</source>
        <translation>er gehört zu den Bildern</translation>
    </message>
    <message>
        <source>&quot;{}&quot; makes no sense</source>
        <translation>„{}“ ergibt keinen Sinn</translation>
    </message>
    <message>
        <source>one of their texts could not be converted</source>
        <translation>einer ihrer Texte konnte nicht umgewandelt werden</translation>
    </message>
    <message>
        <source>{} of their texts could not be converted</source>
        <translation>{} ihrer Texte konnten nicht umgewandelt werden</translation>
    </message>
    <message>
        <source>{} of them are in other editions or within others</source>
        <translation>{} davon gehören zu anderen Fassungen oder stehen innerhalb anderer</translation>
    </message>
    <message>
        <source>{} of them have titles in further languages</source>
        <translation>{} davon haben Titel in weiteren Sprachen</translation>
    </message>
    <message>
        <source>{} of them are out of their order in time</source>
        <translation>{} davon stehen nicht in ihrer zeitlichen Reihenfolge</translation>
    </message>
    <message>
        <source>{} of them lie outside the movie</source>
        <translation>{} davon liegen außerhalb des Films</translation>
    </message>
    <message>
        <source>of their texts only the titles are carried, not {}</source>
        <translation>von ihren Texten gehen nur die Titel mit, nicht aber: {}</translation>
    </message>
    <message>
        <source>timecode</source>
        <translation>Zeitcode</translation>
    </message>
    <message>
        <source>language as {}</source>
        <translation>die Sprache als {}</translation>
    </message>
    <message>
        <source>its sound has no form that could be copied; convert it instead</source>
        <translation>der Ton hat keine Form, die sich kopieren ließe; er muss umgewandelt werden</translation>
    </message>
    <message>
        <source>its sound changes its form there and cannot be copied on; convert it instead</source>
        <translation>der Ton ändert dort seine Form und lässt sich nicht weiter kopieren; er muss umgewandelt werden</translation>
    </message>
    <message>
        <source>there is no file format &quot;{}&quot;</source>
        <translation>es gibt kein Dateiformat „{}“</translation>
    </message>
    <message>
        <source>&quot;{}&quot; has no constant quality; give it a bit rate</source>
        <translation>„{}“ kennt keine gleichbleibende Qualität und braucht eine Bitrate</translation>
    </message>
    <message>
        <source>the quality of &quot;{}&quot; goes from {} (best) to {}, not to {}</source>
        <translation>die Qualität von „{}“ reicht von {} (am besten) bis {}, nicht bis {}</translation>
    </message>
    <message>
        <source>too little is left of the pictures of &quot;{}&quot;, which are {}x{}</source>
        <translation>von den Bildern von „{}“ mit {}x{} Punkten bleibt zu wenig übrig</translation>
    </message>
    <message>
        <source>there are no pictures in the output to draw subtitles into</source>
        <translation>in der neuen Datei gibt es keine Bilder, in die Untertitel gezeichnet werden könnten</translation>
    </message>
    <message>
        <source>there are no pictures to draw subtitles into</source>
        <translation>es gibt keine Bilder, in die Untertitel gezeichnet werden könnten</translation>
    </message>
    <message>
        <source>a split needs pictures: sound alone is written as one file</source>
        <translation>nur Filme mit Bildern lassen sich teilen; Ton allein wird eine einzige Datei</translation>
    </message>
    <message>
        <source>&quot;{}&quot; is a link to a missing file; name that file, or remove the link</source>
        <translation>„{}“ ist ein Verweis auf eine fehlende Datei; bitte diese Datei nennen oder den Verweis löschen</translation>
    </message>
    <message>
        <source>the name of a split output needs an extension, as in &quot;{}&quot;</source>
        <translation>der Name geteilter Dateien braucht eine Endung, etwa „{}“</translation>
    </message>
    <message>
        <source>the name &quot;{}&quot; is too long to number clips; choose a shorter one</source>
        <translation>der Name „{}“ ist zu lang, um Teile zu nummerieren; bitte einen kürzeren wählen</translation>
    </message>
    <message>
        <source>the name &quot;{}&quot; is too long for its file system; choose a shorter one</source>
        <translation>der Name „{}“ ist zu lang für sein Dateisystem; bitte einen kürzeren wählen</translation>
    </message>
    <message>
        <source>&quot;{}&quot; holds no pictures and no sound that can be decoded</source>
        <translation>„{}“ enthält weder Bilder noch Ton, die sich dekodieren lassen</translation>
    </message>
    <message>
        <source>&quot;{}&quot; holds no pictures that can be decoded</source>
        <translation>„{}“ enthält keine Bilder, die sich dekodieren lassen</translation>
    </message>
    <message>
        <source>&quot;{}&quot; holds no sound that can be decoded</source>
        <translation>„{}“ enthält keinen Ton, der sich dekodieren lässt</translation>
    </message>
    <message>
        <source>cannot read &quot;{}&quot; from its start again</source>
        <translation>„{}“ lässt sich nicht noch einmal von vorn lesen</translation>
    </message>
    <message>
        <source>cannot start the decoder {}: {}</source>
        <translation>der Decoder {} lässt sich nicht starten: {}</translation>
    </message>
    <message>
        <source>it is not a movie, or its index is missing because it was never finished</source>
        <translation>es ist kein Film, oder sein Index fehlt, weil er nie fertig geschrieben wurde</translation>
    </message>
    <message>
        <source>it names &quot;{}&quot; over and over</source>
        <translation>es nennt „{}“ immer wieder</translation>
    </message>
    <message>
        <source>it names &quot;{}&quot;: {}</source>
        <translation>es nennt „{}“: {}</translation>
    </message>
    <message>
        <source>it names &quot;{}&quot;, another file</source>
        <translation>es nennt eine andere Datei, „{}“</translation>
    </message>
    <message>
        <source>it names &quot;{}&quot;, which is not a file&apos;s name</source>
        <translation>es nennt „{}“, was kein Dateiname ist</translation>
    </message>
    <message>
        <source>it names &quot;{}&quot;, which does not exist</source>
        <translation>es nennt „{}“, was es nicht gibt</translation>
    </message>
    <message>
        <source>it names &quot;{}&quot;, which lies outside its folder</source>
        <translation>es nennt „{}“, was außerhalb seines Ordners liegt</translation>
    </message>
    <message>
        <source>it names &quot;{}&quot;, which is no regular file</source>
        <translation>es nennt „{}“, was keine gewöhnliche Datei ist</translation>
    </message>
    <message>
        <source>its borders cannot be looked for: {}</source>
        <translation>die Ränder lassen sich nicht suchen: {}</translation>
    </message>
    <message>
        <source>its pictures cannot be filtered: {}</source>
        <translation>die Bilder lassen sich nicht filtern: {}</translation>
    </message>
    <message>
        <source>its HDR pictures with the colour matrix &quot;{}&quot; cannot be brought to BT.709: {}</source>
        <translation>die HDR-Bilder mit der Farbmatrix „{}“ lassen sich nicht auf BT.709 bringen: {}</translation>
    </message>
    <message>
        <source>the file was cut meanwhile</source>
        <translation>die Datei wurde inzwischen gekürzt</translation>
    </message>
    <message>
        <source>it is cut off: it ends at {} although it announces {}</source>
        <translation>sie ist abgeschnitten: sie endet bei {}, obwohl sie {} ankündigt</translation>
    </message>
    <message>
        <source>it ends at {} although it announces {}</source>
        <translation>sie endet bei {}, obwohl sie {} ankündigt</translation>
    </message>
    <message>
        <source>it is cut off</source>
        <translation>sie ist abgeschnitten</translation>
    </message>
    <message>
        <source>it cannot be read from its start again</source>
        <translation>sie lässt sich nicht noch einmal von vorn lesen</translation>
    </message>
    <message>
        <source>the subtitles cannot be decoded: {}</source>
        <translation>die Untertitel lassen sich nicht dekodieren: {}</translation>
    </message>
    <message>
        <source>the subtitles cannot be drawn: {}</source>
        <translation>die Untertitel lassen sich nicht zeichnen: {}</translation>
    </message>
    <message>
        <source>the subtitles of a pipe cannot be drawn into its pictures</source>
        <translation>Untertitel aus einer Pipe lassen sich nicht in ihre Bilder zeichnen</translation>
    </message>
    <message>
        <source>the subtitles {} are not there any more</source>
        <translation>die Untertitel {} gibt es nicht mehr</translation>
    </message>
    <message>
        <source>the subtitles cannot be read ahead of the pictures</source>
        <translation>die Untertitel lassen sich nicht vor den Bildern lesen</translation>
    </message>
    <message>
        <source>cannot make a folder for the subtitles: {}</source>
        <translation>für die Untertitel lässt sich kein Ordner anlegen: {}</translation>
    </message>
    <message>
        <source>cannot write the subtitles to &quot;{}&quot;</source>
        <translation>die Untertitel lassen sich nicht nach „{}“ schreiben</translation>
    </message>
    <message>
        <source>cannot read subtitles from &quot;{}&quot;: {}</source>
        <translation>aus „{}“ lassen sich keine Untertitel lesen: {}</translation>
    </message>
    <message>
        <source>it holds none of text</source>
        <translation>es enthält keine aus Text</translation>
    </message>
    <message>
        <source>it is too large for subtitles</source>
        <translation>es ist zu groß für Untertitel</translation>
    </message>
    <message>
        <source>it is not in the character set &quot;{}&quot;</source>
        <translation>es ist nicht im Zeichensatz „{}“</translation>
    </message>
    <message>
        <source>there is no character set &quot;{}&quot;</source>
        <translation>es gibt keinen Zeichensatz „{}“</translation>
    </message>
    <message>
        <source>{}; {} were written, {} are free: make room or choose another disk</source>
        <translation>{}; {} wurden geschrieben, {} sind frei: bitte Platz schaffen oder einen anderen Datenträger wählen</translation>
    </message>
    <message>
        <source>Writing to &quot;{}&quot; failed after {} bytes: {}</source>
        <translation>das Schreiben nach „{}“ misslang nach {} Byte: {}</translation>
    </message>
    <message>
        <source>Syncing &quot;{}&quot; failed: {}</source>
        <translation>das Sichern von „{}“ auf dem Datenträger misslang: {}</translation>
    </message>
    <message>
        <source>Renaming &quot;{}&quot; failed: {}</source>
        <translation>das Umbenennen von „{}“ misslang: {}</translation>
    </message>
    <message>
        <source>No file can be created in the folder &quot;{}&quot;: {}</source>
        <translation>im Ordner „{}“ lässt sich keine Datei anlegen: {}</translation>
    </message>
    <message>
        <source>Another conversion is writing this file ({})</source>
        <translation>eine andere Umwandlung schreibt diese Datei ({})</translation>
    </message>
    <message>
        <source>The file exists already ({})</source>
        <translation>die Datei gibt es schon ({})</translation>
    </message>
    <message>
        <source>The encoder for &quot;{}&quot; does not accept {}: {}</source>
        <translation>der Encoder für „{}“ nimmt {} nicht an: {}</translation>
    </message>
    <message>
        <source>The encoder {} failed: {}</source>
        <translation>der Encoder {} versagte: {}</translation>
    </message>
    <message>
        <source>Pictures of {}x{} cannot be written; choose another size</source>
        <translation>Bilder mit {}x{} Punkten lassen sich nicht schreiben; bitte eine andere Größe wählen</translation>
    </message>
    <message>
        <source>There is not enough memory</source>
        <translation>der Arbeitsspeicher reicht nicht</translation>
    </message>
    <message>
        <source>No thread can be started: {}</source>
        <translation>es lässt sich kein Thread starten: {}</translation>
    </message>
    <message>
        <source>the media writer gave no reason</source>
        <translation>ein Grund wurde nicht genannt</translation>
    </message>
    <message>
        <source>&quot;{}&quot; holds {:.3f} s of pictures, but {:.3f} s were sent into it</source>
        <translation>„{}“ enthält {} s an Bildern, aber {} s wurden hineingegeben</translation>
    </message>
    <message>
        <source>&quot;{}&quot; holds {:.3f} s of sound, but {:.3f} s were sent into it</source>
        <translation>„{}“ enthält {} s an Ton, aber {} s wurden hineingegeben</translation>
    </message>
    <message>
        <source>&quot;{}&quot; has {} bytes, but {} were written into it</source>
        <translation>„{}“ hat {} Byte, aber {} wurden hineingeschrieben</translation>
    </message>
    <message>
        <source>&quot;{}&quot; has become larger than asked for: {}</source>
        <translation>„{}“ ist größer geworden als gewünscht: {}</translation>
    </message>
    <message>
        <source>the conversion broke off after {}, for want of memory</source>
        <translation>die Umwandlung brach nach {} ab, weil der Arbeitsspeicher nicht reichte</translation>
    </message>
    <message>
        <source>the conversion could not be started</source>
        <translation>die Umwandlung ließ sich nicht starten</translation>
    </message>
    <message>
        <source>no thread could be started for the conversion</source>
        <translation>für die Umwandlung ließ sich kein Thread starten</translation>
    </message>
    <message>
        <source>no thread can be started: {}</source>
        <translation>es lässt sich kein Thread starten: {}</translation>
    </message>
    <message>
        <source>no memory for the converter</source>
        <translation>der Arbeitsspeicher reicht nicht für die Umwandlung</translation>
    </message>
    <message>
        <source>no memory</source>
        <translation>der Arbeitsspeicher reicht nicht</translation>
    </message>
    <message>
        <source>Invalid data found when processing input</source>
        <translation>die Daten sind ungültig</translation>
    </message>
    <message>
        <source>Generic error in an external library</source>
        <translation>Fehler in einer fremden Bibliothek</translation>
    </message>
    <message>
        <source>Unknown error occurred</source>
        <translation>unbekannter Fehler</translation>
    </message>
    <message>
        <source>&quot;{}&quot; needs about {} to {} more, but only {} are free</source>
        <translation>„{}“ braucht noch etwa {} bis {}, aber nur {} sind frei</translation>
    </message>
    <message>
        <source>the pictures are cropped to {}x{}: {} above, {} below, {} left, {} right</source>
        <translation>die Bilder sind auf {}x{} Punkte beschnitten: {} oben, {} unten, {} links, {} rechts</translation>
    </message>
    <message>
        <source>1 of its subtitles was not in UTF-8 and taken for Windows-1252</source>
        <translation>1 Untertitel war nicht in UTF-8 und wurde als Windows-1252 gelesen</translation>
    </message>
    <message>
        <source>{} of its subtitles were not in UTF-8 and taken for Windows-1252</source>
        <translation>{} Untertitel waren nicht in UTF-8 und wurden als Windows-1252 gelesen</translation>
    </message>
    <message>
        <source>interlaced pictures were made progressive</source>
        <translation>Halbbilder wurden zu Vollbildern gemacht</translation>
    </message>
    <message>
        <source>its HDR pictures were brought to the light and colours of BT.709</source>
        <translation>die HDR-Bilder wurden auf Licht und Farben von BT.709 gebracht</translation>
    </message>
    <message>
        <source>its pictures of {} bits got 8</source>
        <translation>die Bilder mit {} Bit bekamen 8</translation>
    </message>
    <message>
        <source>interlaced pictures stayed as they are, in files that do not tell it</source>
        <translation>Halbbilder blieben, wie sie sind, in Dateien, die es nicht sagen</translation>
    </message>
    <message>
        <source>its pictures of {} bits got 10</source>
        <translation>die Bilder mit {} Bit bekamen 10</translation>
    </message>
    <message>
        <source>its {:.0f} pictures a second got {:.0f}</source>
        <translation>aus {} Bildern je Sekunde wurden {}</translation>
    </message>
    <message>
        <source>its {} sound became {}</source>
        <translation>der Ton in {} wurde {}</translation>
    </message>
    <message>
        <source>its sound of {} Hz got {}</source>
        <translation>der Ton mit {} Hz bekam {}</translation>
    </message>
    <message>
        <source>its sound of {} channels got {}</source>
        <translation>der Ton mit {} Kanälen bekam {}</translation>
    </message>
    <message>
        <source>its {} pictures keep their colours at half the resolution (4:2:0)</source>
        <translation>die Bilder in {} behalten ihre Farben in halber Auflösung (4:2:0)</translation>
    </message>
    <message>
        <source>the transparency of its pictures was left out</source>
        <translation>die Durchsichtigkeit der Bilder wurde weggelassen</translation>
    </message>
    <message>
        <source>what Dolby Vision adds to its pictures was left out</source>
        <translation>was Dolby Vision den Bildern hinzufügt, wurde weggelassen</translation>
    </message>
    <message>
        <source>its colours are made for Dolby Vision alone, and are wrong without it</source>
        <translation>die Farben sind allein für Dolby Vision gemacht und ohne es falsch</translation>
    </message>
    <message>
        <source>its closed captions were left out</source>
        <translation>die verborgenen Untertitel (Closed Captions) wurden weggelassen</translation>
    </message>
    <message>
        <source>pictures for both eyes stayed as they are, in files that do not tell it</source>
        <translation>Bilder für beide Augen blieben, wie sie sind, in Dateien, die es nicht sagen</translation>
    </message>
    <message>
        <source>spherical pictures stayed as they are, in files that do not tell it</source>
        <translation>Rundumbilder blieben, wie sie sind, in Dateien, die es nicht sagen</translation>
    </message>
    <message>
        <source>the source&apos;s clock jumped once; the parts were joined</source>
        <translation>die Zeit der Quelle sprang einmal; die Stücke wurden aneinandergefügt</translation>
    </message>
    <message>
        <source>the source&apos;s clock jumped {} times; the parts were joined</source>
        <translation>die Zeit der Quelle sprang {}-mal; die Stücke wurden aneinandergefügt</translation>
    </message>
    <message>
        <source>{} damaged pieces of picture data were skipped</source>
        <translation>beschädigte Stücke der Bilddaten wurden übersprungen: {}</translation>
    </message>
    <message>
        <source>{} damaged pieces of sound data were skipped</source>
        <translation>beschädigte Stücke der Tondaten wurden übersprungen: {}</translation>
    </message>
    <message>
        <source>{} pictures had a missing or falling time stamp</source>
        <translation>Bilder ohne oder mit rückwärts laufendem Zeitstempel: {}</translation>
    </message>
    <message>
        <source>the sound had {} gaps or overlaps, which were closed</source>
        <translation>Lücken oder Überlappungen im Ton wurden geschlossen: {}</translation>
    </message>
    <message>
        <source>some of its pictures have {}x{} and were fitted into those of {}x{}</source>
        <translation>einige Bilder haben {}x{} und wurden in solche von {}x{} eingepasst</translation>
    </message>
    <message>
        <source>some of its sound has {} channels and got {}</source>
        <translation>ein Teil des Tons hat {} Kanäle und bekam {}</translation>
    </message>
    <message>
        <source>{} damaged pieces of sound data were skipped in stream {}</source>
        <translation>beschädigte Stücke der Tondaten in Spur {1} wurden übersprungen: {0}</translation>
    </message>
    <message>
        <source>the sound of stream {} had {} gaps or overlaps, which were closed</source>
        <translation>Lücken oder Überlappungen im Ton von Spur {} wurden geschlossen: {}</translation>
    </message>
    <message>
        <source>pictures of {:.0f} s, which the source announces only at {:.0f} s, were left out</source>
        <translation>Bilder von {} s, die die Quelle erst bei {} s ankündigt, wurden weggelassen</translation>
    </message>
    <message>
        <source>sound of {:.0f} s, which the source announces only at {:.0f} s, was left out</source>
        <translation>Ton von {} s, den die Quelle erst bei {} s ankündigt, wurde weggelassen</translation>
    </message>
    <message>
        <source>{}: the parent &quot;{}&quot; has this preset as a parent itself</source>
        <translation>{}: die Grundlage „{}“ hat diese Vorlage selbst als Grundlage</translation>
    </message>
    <message>
        <source>{}: there is no preset &quot;{}&quot;</source>
        <translation>{}: es gibt keine Vorlage „{}“</translation>
    </message>
    <message>
        <source>there is no preset &quot;{}&quot;</source>
        <translation>es gibt keine Vorlage „{}“</translation>
    </message>
    <message>
        <source>{}: &quot;{}&quot; is there twice</source>
        <translation>{}: „{}“ steht zweimal da</translation>
    </message>
    <message>
        <source>{}: this is no JSON: {}</source>
        <translation>{}: das ist kein JSON: {}</translation>
    </message>
    <message>
        <source>cannot read the preset &quot;{}&quot;: {}</source>
        <translation>die Vorlage „{}“ lässt sich nicht lesen: {}</translation>
    </message>
    <message>
        <source>&quot;{}&quot; is too large for a preset</source>
        <translation>„{}“ ist zu groß für eine Vorlage</translation>
    </message>
    <message>
        <source>a preset has a name</source>
        <translation>eine Vorlage hat einen Namen</translation>
    </message>
    <message>
        <source>{}: &quot;{}&quot; has to be {}</source>
        <translation>{}: „{}“ muss {} sein</translation>
    </message>
    <message>
        <source>a text</source>
        <translation>ein Text</translation>
    </message>
    <message>
        <source>the name of a preset, or null</source>
        <translation>der Name einer Vorlage oder null</translation>
    </message>
    <message>
        <source>a format&apos;s code or extension</source>
        <translation>das Kürzel oder die Endung eines Formats</translation>
    </message>
    <message>
        <source>an object, in braces</source>
        <translation>ein Objekt in geschweiften Klammern</translation>
    </message>
    <message>
        <source>a codec&apos;s code of up to four characters, or a list of them</source>
        <translation>das Kürzel eines Codecs mit bis zu vier Zeichen oder eine Liste davon</translation>
    </message>
    <message>
        <source>a number from 0 to 63, or such numbers by picture height or codec</source>
        <translation>eine Zahl von 0 bis 63, oder solche Zahlen nach Bildhöhe oder Codec</translation>
    </message>
    <message>
        <source>a bit rate such as &quot;{}&quot;, or such rates by number of channels</source>
        <translation>eine Bitrate wie „{}“, oder solche Raten nach Zahl der Kanäle</translation>
    </message>
    <message>
        <source>a bit rate such as &quot;{}&quot;</source>
        <translation>eine Bitrate wie „{}“</translation>
    </message>
    <message>
        <source>&quot;{}&quot; of an earlier conversion stays beside the new clips</source>
        <translation>„{}“ aus einer früheren Umwandlung bleibt neben den neuen Clips</translation>
    </message>
    <message>
        <source>&quot;{}&quot; to &quot;{}&quot; of an earlier conversion stay beside the new clips</source>
        <translation>„{}“ bis „{}“ aus einer früheren Umwandlung bleiben neben den neuen Clips</translation>
    </message>
    <message>
        <source>a frame rate from {} to {}, such as 25 or &quot;{}&quot;</source>
        <translation>eine Bildrate von {} bis {}, etwa 25 oder „{}“</translation>
    </message>
    <message>
        <source>slowest, slower, slow, medium, fast, faster or fastest</source>
        <translation>slowest, slower, slow, medium, fast, faster oder fastest</translation>
    </message>
    <message>
        <source>baseline, main or high</source>
        <translation>baseline, main oder high</translation>
    </message>
    <message>
        <source>a size such as &quot;{}&quot;</source>
        <translation>eine Größe wie „{}“</translation>
    </message>
    <message>
        <source>true or false</source>
        <translation>true oder false</translation>
    </message>
    <message>
        <source>&quot;{}&quot;: {}</source>
        <translation>„{}“: {}</translation>
    </message>
    <message>
        <source>none</source>
        <translation>keine</translation>
    </message>
    <message>
        <source>{}:1: a preset is a JSON object, in braces</source>
        <translation>{}:1: eine Vorlage ist ein JSON-Objekt in geschweiften Klammern</translation>
    </message>
    <message>
        <source>a number from 1 to 8</source>
        <translation>eine Zahl von 1 bis 8</translation>
    </message>
    <message>
        <source>a number from 4000 to 384000</source>
        <translation>eine Zahl von 4000 bis 384000</translation>
    </message>
    <message>
        <source>{}: there is no &quot;{}&quot; in presets; it has no effect</source>
        <translation>{}: „{}“ gibt es in Vorlagen nicht; es bewirkt nichts</translation>
    </message>
    <message>
        <source>{}: this is nested too deep for a preset</source>
        <translation>{}: das ist für eine Vorlage zu tief verschachtelt</translation>
    </message>
    <message>
        <source>the script is too long or not a file</source>
        <translation>das Skript ist zu lang oder keine Datei</translation>
    </message>
    <message>
        <source>it names &quot;{}&quot;, which is not a plain name</source>
        <translation>es nennt „{}“, was kein einfacher Name ist</translation>
    </message>
    <message>
        <source>it names &quot;{}&quot;, which is not a movie</source>
        <translation>es nennt „{}“, was kein Film ist</translation>
    </message>
    <message>
        <source>its line &quot;{}&quot; is not understood</source>
        <translation>seine Zeile „{}“ ist nicht zu verstehen</translation>
    </message>
    <message>
        <source>its folder has a name that scripts cannot lie in</source>
        <translation>sein Ordner hat einen Namen, in dem Skripte nicht liegen können</translation>
    </message>
    <message>
        <source>cannot open &quot;{}&quot;: a file that it names: {}</source>
        <translation>„{}“ lässt sich nicht öffnen: eine Datei, die es nennt: {}</translation>
    </message>
    <message>
        <source>&quot;{}&quot; is {}; give the output another name</source>
        <translation>„{}“ ist {}; die neue Datei braucht einen anderen Namen</translation>
    </message>
    <message>
        <source>the source itself</source>
        <translation>die Quelle selbst</translation>
    </message>
    <message>
        <source>a file of subtitles that is read</source>
        <translation>eine Untertiteldatei, die gelesen wird</translation>
    </message>
    <message>
        <source>a codec without a bit rate cannot keep below a size</source>
        <translation>ein Codec ohne Bitrate kann keine Größe einhalten</translation>
    </message>
    <message>
        <source>{} are too little for {}</source>
        <translation>{} sind zu wenig für {}</translation>
    </message>
    <message>
        <source>pictures at {} kbit/s in {}x{}</source>
        <translation>Bilder mit {} kbit/s in {}x{}</translation>
    </message>
    <message>
        <source>pictures at {} kbit/s</source>
        <translation>Bilder mit {} kbit/s</translation>
    </message>
    <message>
        <source>sound at {} kbit/s</source>
        <translation>Ton mit {} kbit/s</translation>
    </message>
    <message>
        <source>to keep below {}: {}, {}</source>
        <translation>um unter {} zu bleiben: {}, {}</translation>
    </message>
    <message>
        <source>to keep below {}: {}</source>
        <translation>um unter {} zu bleiben: {}</translation>
    </message>
    <message>
        <source>to keep below {}:</source>
        <translation>um unter {} zu bleiben:</translation>
    </message>
    <message>
        <source>none of its pictures from {} to its end at {} could be decoded</source>
        <translation>von seinen Bildern ließ sich von {} bis zum Ende bei {} keines dekodieren</translation>
    </message>
    <message>
        <source>none of its pictures could be decoded</source>
        <translation>von seinen Bildern ließ sich keines dekodieren</translation>
    </message>
    <message>
        <source>its pictures of full range got the usual one, which has fewer levels</source>
        <translation>seine Bilder mit vollem Wertebereich bekamen den üblichen, der weniger Stufen hat</translation>
    </message>
    <message>
        <source>none of its sound from {} to its end at {} could be decoded</source>
        <translation>von seinem Ton ließ sich von {} bis zum Ende bei {} nichts dekodieren</translation>
    </message>
    <message>
        <source>subtitles that appeared more than {:.0f} s before the begin and may still be shown there were not looked for</source>
        <translation>Untertitel, die mehr als {} s vor dem Beginn erschienen sind und dort noch zu sehen sein können, wurden nicht gesucht</translation>
    </message>
    <message>
        <source>the order in which they play parts of the movie is not followed</source>
        <translation>der Reihenfolge, in der sie Teile des Films spielen, wird nicht gefolgt</translation>
    </message>
    <message>
        <source>{} of them stand for parts of other files, which are not played</source>
        <translation>{} davon stehen für Teile anderer Dateien, die nicht gespielt werden</translation>
    </message>
    <message>
        <source>1 damaged piece of sound data was skipped in stream {}</source>
        <translation>1 beschädigtes Stück der Tondaten in Spur {} wurde übersprungen</translation>
    </message>
    <message>
        <source>the sound of stream {} had 1 gap or overlap, which was closed</source>
        <translation>1 Lücke oder Überlappung im Ton von Spur {} wurde geschlossen</translation>
    </message>
    <message>
        <source>1 damaged piece of picture data was skipped</source>
        <translation>1 beschädigtes Stück der Bilddaten wurde übersprungen</translation>
    </message>
    <message>
        <source>1 picture had a missing or falling time stamp</source>
        <translation>1 Bild hatte keinen oder einen rückwärts laufenden Zeitstempel</translation>
    </message>
    <message>
        <source>1 damaged piece of sound data was skipped</source>
        <translation>1 beschädigtes Stück der Tondaten wurde übersprungen</translation>
    </message>
    <message>
        <source>the sound had 1 gap or overlap, which was closed</source>
        <translation>1 Lücke oder Überlappung im Ton wurde geschlossen</translation>
    </message>
    <message>
        <source>its index is at its end, and a pipe cannot be sought</source>
        <translation>sein Index steht am Ende, und in einer Pipe lässt sich nicht zurückspringen</translation>
    </message>
    <message>
        <source>&quot;{}&quot; has no pictures: none came from its part of the source</source>
        <translation>„{}“ hat keine Bilder: aus seinem Teil der Quelle kamen keine</translation>
    </message>
</context>
<context>
    <name>LogShare</name>
    <message>
        <source>There is more, which is left out.</source>
        <translation>Es gibt mehr, was weggelassen ist.</translation>
    </message>
</context>
<context>
    <name>Presets</name>
    <message>
        <source>Standard</source>
        <translation>Standard</translation>
    </message>
    <message>
        <source>Looks like the source and plays on nearly everything (H.264, AAC).</source>
        <translation>Sieht aus wie die Quelle und läuft fast überall (H.264, AAC).</translation>
    </message>
    <message>
        <source>Small</source>
        <translation>Klein</translation>
    </message>
    <message>
        <source>Half the size at nearly the same quality, and slower (HEVC, AAC).</source>
        <translation>Halb so groß bei fast gleicher Qualität, dafür langsamer (HEVC, AAC).</translation>
    </message>
    <message>
        <source>Web</source>
        <translation>Web</translation>
    </message>
    <message>
        <source>For web pages, in formats that are free of patents (VP9, Opus).</source>
        <translation>Für Webseiten, in patentfreien Formaten (VP9, Opus).</translation>
    </message>
    <message>
        <source>Phone</source>
        <translation>Telefon</translation>
    </message>
    <message>
        <source>Small pictures for small screens (H.264 up to 720 lines, AAC).</source>
        <translation>Kleine Bilder für kleine Bildschirme (H.264 bis 720 Zeilen, AAC).</translation>
    </message>
    <message>
        <source>Sound alone</source>
        <translation>Nur Ton</translation>
    </message>
    <message>
        <source>Leaves the pictures out (AAC).</source>
        <translation>Lässt die Bilder weg (AAC).</translation>
    </message>
    <message>
        <source>Best</source>
        <translation>Beste</translation>
    </message>
    <message>
        <source>No difference to be seen, in large files (H.264, AAC).</source>
        <translation>Kein Unterschied zu sehen, in großen Dateien (H.264, AAC).</translation>
    </message>
    <message>
        <source>AV1</source>
        <translation>AV1</translation>
    </message>
    <message>
        <source>The smallest files, for new players (AV1, Opus).</source>
        <translation>Die kleinsten Dateien, für neue Abspieler (AV1, Opus).</translation>
    </message>
    <message>
        <source>Archive</source>
        <translation>Archiv</translation>
    </message>
    <message>
        <source>Lossless up to 10 bits, but for colours finer than 4:2:0; very large files (FFV1, FLAC).</source>
        <translation>Verlustfrei bis 10 Bit, außer bei Farben, die feiner sind als 4:2:0; sehr große Dateien (FFV1, FLAC).</translation>
    </message>
    <message>
        <source>Classic</source>
        <translation>Klassisch</translation>
    </message>
    <message>
        <source>As the program converted in its first version (MPEG-4, AAC).</source>
        <translation>Wie das Programm in seiner ersten Version umgewandelt hat (MPEG-4, AAC).</translation>
    </message>
    <message>
        <source>The preset cannot be saved: %1.</source>
        <translation>Die Vorlage kann nicht gespeichert werden: %1.</translation>
    </message>
    <message>
        <source>There is no folder for presets of your own.</source>
        <translation>Es gibt keinen Ordner für eigene Vorlagen.</translation>
    </message>
    <message>
        <source>You have a preset “%1” already.</source>
        <translation>Es gibt schon eine eigene Vorlage „%1“.</translation>
    </message>
    <message>
        <source>Made of “%1”.</source>
        <translation>Aus „%1“ gemacht.</translation>
    </message>
    <message>
        <source>cropping</source>
        <translation>Beschneiden</translation>
    </message>
    <message>
        <source>deinterlacing</source>
        <translation>Zeilensprung entfernen</translation>
    </message>
    <message>
        <source>HDR</source>
        <translation>HDR</translation>
    </message>
    <message>
        <source>colour depth</source>
        <translation>Farbtiefe</translation>
    </message>
    <message>
        <source>length of clips</source>
        <translation>Länge der Clips</translation>
    </message>
    <message>
        <source>leaving chapters out</source>
        <translation>Kapitel weglassen</translation>
    </message>
    <message>
        <source>leaving texts out</source>
        <translation>Texte weglassen</translation>
    </message>
</context>
<context>
    <name>Words</name>
    <message>
        <source>%1 %</source>
        <translation>%1 %</translation>
    </message>
    <message>
        <source>%1 left</source>
        <translation>noch %1</translation>
    </message>
    <message>
        <source>Looking at it…</source>
        <translation>Wird angesehen …</translation>
    </message>
    <message>
        <source>to %1</source>
        <translation>nach %1</translation>
    </message>
    <message>
        <source>a few seconds</source>
        <translation>ein paar Sekunden</translation>
    </message>
    <message>
        <source>less than a minute</source>
        <translation>weniger als eine Minute</translation>
    </message>
    <message numerus="yes">
        <source>about %n minutes</source>
        <translation>
            <numerusform>etwa eine Minute</numerusform>
            <numerusform>etwa %n Minuten</numerusform>
        </translation>
    </message>
    <message>
        <source>about %1 h %2 min</source>
        <translation>etwa %1 h %2 min</translation>
    </message>
    <message>
        <source>%1×</source>
        <translation>%1×</translation>
    </message>
    <message>
        <source>%1 pictures a second</source>
        <translation>%1 Bilder je Sekunde</translation>
    </message>
    <message>
        <source>Track %1</source>
        <translation>Spur %1</translation>
    </message>
    <message>
        <source>Starting…</source>
        <translation>Beginnt …</translation>
    </message>
    <message>
        <source>Converting</source>
        <translation>Wird umgewandelt</translation>
    </message>
    <message>
        <source>Paused</source>
        <translation>Angehalten</translation>
    </message>
    <message>
        <source>The disk is full: waiting for room</source>
        <translation>Der Datenträger ist voll: wartet auf Platz</translation>
    </message>
    <message>
        <source>Finishing the file…</source>
        <translation>Die Datei wird fertiggestellt …</translation>
    </message>
    <message>
        <source>Stopping, keeping what is done…</source>
        <translation>Wird abgebrochen, Fertiges bleibt …</translation>
    </message>
    <message>
        <source>Done · %1</source>
        <translation>Fertig · %1</translation>
    </message>
    <message>
        <source>Stopped after %1</source>
        <translation>Abgebrochen nach %1</translation>
    </message>
    <message>
        <source>Interrupted when the program ended</source>
        <translation>Vom Ende des Programms unterbrochen</translation>
    </message>
    <message>
        <source>Cannot be converted</source>
        <translation>Kann nicht umgewandelt werden</translation>
    </message>
</context>
<context>
    <name>movieconv::window::App</name>
    <message numerus="yes">
        <source>%n movies were converted.</source>
        <translation>
            <numerusform>Ein Film wurde umgewandelt.</numerusform>
            <numerusform>%n Filme wurden umgewandelt.</numerusform>
        </translation>
    </message>
    <message numerus="yes">
        <source>%n could not be converted.</source>
        <translation>
            <numerusform>Einer konnte nicht umgewandelt werden.</numerusform>
            <numerusform>%n konnten nicht umgewandelt werden.</numerusform>
        </translation>
    </message>
    <message>
        <source>Conversion done</source>
        <translation>Umwandlung fertig</translation>
    </message>
    <message>
        <source>Conversion done, with failures</source>
        <translation>Umwandlung fertig, mit Fehlern</translation>
    </message>
</context>
<context>
    <name>movieconv::window::BurnChoice</name>
    <message>
        <source>Subtitles drawn into the pictures</source>
        <translation>Untertitel, die ins Bild gezeichnet werden</translation>
    </message>
    <message>
        <source>They are seen on every player and cannot be switched off.</source>
        <translation>Sie sind auf jedem Abspieler zu sehen und lassen sich nicht abschalten.</translation>
    </message>
    <message>
        <source>A file…</source>
        <translation>Datei…</translation>
    </message>
    <message>
        <source>Draw the subtitles of a file</source>
        <translation>Untertitel aus einer Datei ins Bild zeichnen</translation>
    </message>
    <message>
        <source>Dra&amp;wn in</source>
        <translation>Im &amp;Bild</translation>
    </message>
    <message>
        <source>No subtitles</source>
        <translation>Keine Untertitel</translation>
    </message>
    <message>
        <source>Draw subtitles</source>
        <translation>Untertitel ins Bild zeichnen</translation>
    </message>
</context>
<context>
    <name>movieconv::window::Closing</name>
    <message>
        <source>Movies are being converted. What is converted so far can be kept as it is.</source>
        <translation>Es werden gerade Filme umgewandelt. Was bisher fertig ist, kann behalten werden.</translation>
    </message>
    <message>
        <source>Stop and close</source>
        <translation>Abbrechen und schließen</translation>
    </message>
    <message>
        <source>Close when done</source>
        <translation>Schließen, wenn fertig</translation>
    </message>
    <message>
        <source>Go on</source>
        <translation>Weitermachen</translation>
    </message>
    <message>
        <source>Waiting until all is stopped. A disk or a network that does not answer holds this up.</source>
        <translation>Es wird gewartet, bis alles abgebrochen ist. Ein Laufwerk oder Netz, das nicht antwortet, hält das auf.</translation>
    </message>
    <message>
        <source>Close at once</source>
        <translation>Sofort schließen</translation>
    </message>
</context>
<context>
    <name>movieconv::window::CropChoice</name>
    <message>
        <source>Crop</source>
        <translation>Beschneiden</translation>
    </message>
    <message>
        <source>Nothing</source>
        <translation>Nichts</translation>
    </message>
    <message>
        <source>Black borders</source>
        <translation>Schwarze Ränder</translation>
    </message>
    <message>
        <source>By hand</source>
        <translation>Von Hand</translation>
    </message>
    <message>
        <source>above</source>
        <translation>oben</translation>
    </message>
    <message>
        <source>below</source>
        <translation>unten</translation>
    </message>
    <message>
        <source>left</source>
        <translation>links</translation>
    </message>
    <message>
        <source>right</source>
        <translation>rechts</translation>
    </message>
    <message>
        <source>Pixels to cut off: %1</source>
        <translation>Abzuschneidende Bildpunkte: %1</translation>
    </message>
</context>
<context>
    <name>movieconv::window::EntryPage</name>
    <message>
        <source>Why it cannot be converted</source>
        <translation>Warum der Film nicht umgewandelt werden kann</translation>
    </message>
    <message>
        <source>As the preset has it</source>
        <translation>Wie in der Vorlage</translation>
    </message>
    <message>
        <source>&amp;File format</source>
        <translation>Da&amp;teiformat</translation>
    </message>
    <message>
        <source>Picture &amp;size</source>
        <translation>Bild&amp;größe</translation>
    </message>
    <message>
        <source>Quality</source>
        <translation>Qualität</translation>
    </message>
    <message>
        <source>To the left small files, to the right good pictures.</source>
        <translation>Links kleine Dateien, rechts gute Bilder.</translation>
    </message>
    <message>
        <source>Range</source>
        <translation>Ausschnitt</translation>
    </message>
    <message>
        <source>Save as</source>
        <translation>Speichern als</translation>
    </message>
    <message>
        <source>Sound tracks</source>
        <translation>Tonspuren</translation>
    </message>
    <message>
        <source>Subtitles</source>
        <translation>Untertitel</translation>
    </message>
    <message>
        <source>&amp;Use for all that wait</source>
        <translation>Für &amp;alle verwenden</translation>
    </message>
    <message>
        <source>Gives every waiting movie these settings; ranges and tracks stay as they are.</source>
        <translation>Gibt allen wartenden Filmen diese Einstellungen; Ausschnitte und Spuren bleiben, wie sie sind.</translation>
    </message>
    <message>
        <source>Sa&amp;ve as preset…</source>
        <translation>Vorlage &amp;speichern …</translation>
    </message>
    <message>
        <source>As the source</source>
        <translation>Wie die Quelle</translation>
    </message>
    <message>
        <source>%1 lines</source>
        <translation>%1 Zeilen</translation>
    </message>
    <message>
        <source>Looking at it…</source>
        <translation>Wird angesehen …</translation>
    </message>
    <message>
        <source>The preset&apos;s (.%1)</source>
        <translation>Das der Vorlage (.%1)</translation>
    </message>
    <message>
        <source>The preset&apos;s</source>
        <translation>Das der Vorlage</translation>
    </message>
    <message>
        <source>As the source (%1 × %2)</source>
        <translation>Wie die Quelle (%1 × %2)</translation>
    </message>
    <message>
        <source>Small file</source>
        <translation>Kleine Datei</translation>
    </message>
    <message>
        <source>Balanced</source>
        <translation>Ausgewogen</translation>
    </message>
    <message>
        <source>Good pictures</source>
        <translation>Gute Bilder</translation>
    </message>
    <message>
        <source>&amp;Preset</source>
        <translation>Vo&amp;rlage</translation>
    </message>
    <message>
        <source>Qualit&amp;y</source>
        <translation>&amp;Qualität</translation>
    </message>
    <message>
        <source>&amp;Load preset…</source>
        <translation>&amp;Vorlage laden …</translation>
    </message>
    <message>
        <source>Preset</source>
        <translation>Vorlage</translation>
    </message>
    <message>
        <source>Crop</source>
        <translation>Beschneiden</translation>
    </message>
    <message>
        <source>Cut &amp;into clips</source>
        <translation>In &amp;Clips teilen</translation>
    </message>
    <message>
        <source>Writes several files, each of that length.</source>
        <translation>Schreibt mehrere Dateien von dieser Länge.</translation>
    </message>
    <message>
        <source>Repairs the combs of old television pictures.</source>
        <translation>Beseitigt die Kammstreifen alter Fernsehbilder.</translation>
    </message>
    <message>
        <source>Deinterlacin&amp;g</source>
        <translation>Zeilens&amp;prung entfernen</translation>
    </message>
    <message>
        <source>Leave the sound as it is</source>
        <translation>Ton unverändert lassen</translation>
    </message>
    <message>
        <source>Sound is not converted but taken over: without loss, with its own channels.</source>
        <translation>Der Ton wird nicht umgewandelt, sondern übernommen: ohne Verlust, mit seinen eigenen Kanälen.</translation>
    </message>
    <message>
        <source>No, one file</source>
        <translation>Nein, eine Datei</translation>
    </message>
    <message numerus="yes">
        <source>Of %n minutes</source>
        <translation>
            <numerusform>Von einer Minute</numerusform>
            <numerusform>Von %n Minuten</numerusform>
        </translation>
    </message>
    <message>
        <source>Where the source says so</source>
        <translation>Wo die Quelle es angibt</translation>
    </message>
    <message>
        <source>Never</source>
        <translation>Nie</translation>
    </message>
    <message>
        <source>Everything</source>
        <translation>Alles</translation>
    </message>
    <message>
        <source>Look &amp;again</source>
        <translation>&amp;Noch einmal prüfen</translation>
    </message>
    <message>
        <source>Finds out whether the movie can be converted now</source>
        <translation>Prüft, ob der Film sich jetzt umwandeln lässt</translation>
    </message>
</context>
<context>
    <name>movieconv::window::LogPanel</name>
    <message>
        <source>Shows or hides what happened during the conversion</source>
        <translation>Zeigt oder verbirgt, was während der Umwandlung geschah</translation>
    </message>
    <message>
        <source>Log of the conversion</source>
        <translation>Protokoll der Umwandlung</translation>
    </message>
    <message numerus="yes">
        <source>&amp;Log (%n lines)</source>
        <translation>
            <numerusform>&amp;Protokoll (eine Zeile)</numerusform>
            <numerusform>&amp;Protokoll (%n Zeilen)</numerusform>
        </translation>
    </message>
</context>
<context>
    <name>movieconv::window::MainWindow</name>
    <message>
        <source>MovieConv</source>
        <translation>MovieConv</translation>
    </message>
    <message numerus="yes">
        <source>%n movies were being converted when the program ended.</source>
        <translation>
            <numerusform>Ein Film wurde gerade umgewandelt, als das Programm endete.</numerusform>
            <numerusform>%n Filme wurden gerade umgewandelt, als das Programm endete.</numerusform>
        </translation>
    </message>
    <message>
        <source>Convert again</source>
        <translation>Noch einmal umwandeln</translation>
    </message>
    <message>
        <source>Movies and sound</source>
        <translation>Filme und Ton</translation>
    </message>
    <message>
        <source>All files</source>
        <translation>Alle Dateien</translation>
    </message>
    <message>
        <source>Open movies</source>
        <translation>Filme öffnen</translation>
    </message>
    <message>
        <source>Open a folder with movies</source>
        <translation>Einen Ordner mit Filmen öffnen</translation>
    </message>
    <message>
        <source>Save the settings as a preset</source>
        <translation>Die Einstellungen als Vorlage speichern</translation>
    </message>
    <message>
        <source>Presets (*.json)</source>
        <translation>Vorlagen (*.json)</translation>
    </message>
    <message>
        <source>Load a preset</source>
        <translation>Eine Vorlage laden</translation>
    </message>
    <message>
        <source>%1 of %2 done</source>
        <translation>%1 von %2 fertig</translation>
    </message>
    <message numerus="yes">
        <source>%n failed</source>
        <translation>
            <numerusform>einer misslungen</numerusform>
            <numerusform>%n misslungen</numerusform>
        </translation>
    </message>
    <message>
        <source>paused</source>
        <translation>angehalten</translation>
    </message>
    <message>
        <source>%1 left for all</source>
        <translation>noch %1 für alle</translation>
    </message>
    <message>
        <source>stops after this one</source>
        <translation>hält nach diesem an</translation>
    </message>
    <message numerus="yes">
        <source>%n movies are ready</source>
        <translation>
            <numerusform>Ein Film ist bereit</numerusform>
            <numerusform>%n Filme sind bereit</numerusform>
        </translation>
    </message>
    <message>
        <source>%1 % – MovieConv</source>
        <translation>%1 % – MovieConv</translation>
    </message>
    <message>
        <source>&amp;Resume</source>
        <translation>&amp;Fortsetzen</translation>
    </message>
    <message>
        <source>&amp;Pause</source>
        <translation>An&amp;halten</translation>
    </message>
    <message>
        <source>Resume</source>
        <translation>Fortsetzen</translation>
    </message>
    <message>
        <source>Convert</source>
        <translation>Umwandeln</translation>
    </message>
    <message>
        <source>The disk with “%1” is full. Make room, and the conversion goes on by itself; or stop it and keep what is done.</source>
        <translation>Der Datenträger mit „%1“ ist voll. Sobald Platz ist, geht die Umwandlung von selbst weiter; oder abbrechen und behalten, was fertig ist.</translation>
    </message>
    <message>
        <source>“%1” is not a file on this machine.</source>
        <translation>„%1“ ist keine Datei auf diesem Rechner.</translation>
    </message>
    <message>
        <source>&amp;Movies</source>
        <translation>&amp;Filme</translation>
    </message>
    <message>
        <source>&amp;Open movies…</source>
        <translation>Filme ö&amp;ffnen …</translation>
    </message>
    <message>
        <source>Open a &amp;folder…</source>
        <translation>Einen &amp;Ordner öffnen …</translation>
    </message>
    <message>
        <source>Ctrl+Shift+O</source>
        <translation>Ctrl+Shift+O</translation>
    </message>
    <message>
        <source>&amp;Names and folder of new files…</source>
        <translation>&amp;Namen und Ordner neuer Dateien …</translation>
    </message>
    <message>
        <source>Ctrl+N</source>
        <translation>Ctrl+N</translation>
    </message>
    <message>
        <source>&amp;Quit</source>
        <translation>&amp;Beenden</translation>
    </message>
    <message>
        <source>&amp;Queue</source>
        <translation>&amp;Warteschlange</translation>
    </message>
    <message>
        <source>Move &amp;up</source>
        <translation>Nach o&amp;ben</translation>
    </message>
    <message>
        <source>Ctrl+Up</source>
        <translation>Ctrl+Up</translation>
    </message>
    <message>
        <source>Move &amp;down</source>
        <translation>Nach &amp;unten</translation>
    </message>
    <message>
        <source>Ctrl+Down</source>
        <translation>Ctrl+Down</translation>
    </message>
    <message>
        <source>Convert &amp;again</source>
        <translation>&amp;Erneut umwandeln</translation>
    </message>
    <message>
        <source>Ctrl+R</source>
        <translation>Ctrl+R</translation>
    </message>
    <message>
        <source>&amp;Play the converted movie</source>
        <translation>Den fertigen Film ab&amp;spielen</translation>
    </message>
    <message>
        <source>Ctrl+Shift+P</source>
        <translation>Ctrl+Shift+P</translation>
    </message>
    <message>
        <source>Show in &amp;folder</source>
        <translation>Im &amp;Ordner zeigen</translation>
    </message>
    <message>
        <source>Ctrl+Shift+F</source>
        <translation>Ctrl+Shift+F</translation>
    </message>
    <message>
        <source>&amp;Remove</source>
        <translation>En&amp;tfernen</translation>
    </message>
    <message>
        <source>Remove what is &amp;over</source>
        <translation>Er&amp;ledigtes entfernen</translation>
    </message>
    <message>
        <source>Ctrl+Shift+Del</source>
        <translation>Ctrl+Shift+Del</translation>
    </message>
    <message>
        <source>&amp;Conversion</source>
        <translation>&amp;Umwandlung</translation>
    </message>
    <message>
        <source>&amp;Convert</source>
        <translation>&amp;Umwandeln</translation>
    </message>
    <message>
        <source>Ctrl+Return</source>
        <translation>Ctrl+Return</translation>
    </message>
    <message>
        <source>Ctrl+P</source>
        <translation>Ctrl+P</translation>
    </message>
    <message>
        <source>&amp;Stop everything</source>
        <translation>Alles a&amp;bbrechen</translation>
    </message>
    <message>
        <source>Ctrl+.</source>
        <translation>Ctrl+.</translation>
    </message>
    <message>
        <source>Stop &amp;after this one</source>
        <translation>&amp;Nach diesem anhalten</translation>
    </message>
    <message>
        <source>Ctrl+E</source>
        <translation>Ctrl+E</translation>
    </message>
    <message>
        <source>At the same &amp;time</source>
        <translation>&amp;Gleichzeitig</translation>
    </message>
    <message>
        <source>When &amp;everything is done</source>
        <translation>Wenn alles fertig i&amp;st</translation>
    </message>
    <message numerus="yes">
        <source>%n movies</source>
        <translation>
            <numerusform>Ein Film</numerusform>
            <numerusform>%n Filme</numerusform>
        </translation>
    </message>
    <message>
        <source>Play a &amp;sound</source>
        <translation>Einen &amp;Ton abspielen</translation>
    </message>
    <message>
        <source>Stay &amp;open</source>
        <translation>&amp;Offen bleiben</translation>
    </message>
    <message>
        <source>S&amp;uspend the machine</source>
        <translation>Den &amp;Rechner schlafen legen</translation>
    </message>
    <message>
        <source>&amp;Help</source>
        <translation>&amp;Hilfe</translation>
    </message>
    <message>
        <source>&amp;About MovieConv</source>
        <translation>Ü&amp;ber MovieConv</translation>
    </message>
    <message>
        <source>About MovieConv</source>
        <translation>Über MovieConv</translation>
    </message>
    <message>
        <source>MovieConv %1 converts movies.</source>
        <translation>MovieConv %1 wandelt Filme um.</translation>
    </message>
    <message>
        <source>Drop movies here</source>
        <translation>Filme hierher ziehen</translation>
    </message>
    <message>
        <source>Drop movies or folders here, choose what they shall become, and press Convert.</source>
        <translation>Filme oder Ordner hierher ziehen, wählen, was aus ihnen werden soll, und auf Umwandeln drücken.</translation>
    </message>
    <message>
        <source>How the queue stands</source>
        <translation>Stand der Warteschlange</translation>
    </message>
    <message>
        <source>Progress of the queue</source>
        <translation>Fortschritt der Warteschlange</translation>
    </message>
    <message>
        <source>A&amp;dd movies…</source>
        <translation>Filme hin&amp;zufügen …</translation>
    </message>
    <message>
        <source>Pause</source>
        <translation>Anhalten</translation>
    </message>
    <message>
        <source>Stop</source>
        <translation>Abbrechen</translation>
    </message>
    <message>
        <source>Pauses everything</source>
        <translation>Hält alles an</translation>
    </message>
    <message>
        <source>Stops everything; what is converted is kept</source>
        <translation>Bricht alles ab; was fertig ist, bleibt</translation>
    </message>
    <message>
        <source>Converts all movies that wait</source>
        <translation>Wandelt alle wartenden Filme um</translation>
    </message>
    <message>
        <source>closes when done</source>
        <translation>schließt danach</translation>
    </message>
    <message>
        <source>The preset is saved without what presets cannot hold: %1.</source>
        <translation>Die Vorlage ist gespeichert, aber ohne das, was Vorlagen nicht enthalten können: %1.</translation>
    </message>
</context>
<context>
    <name>movieconv::window::MoreSettings</name>
    <message>
        <source>M&amp;ore</source>
        <translation>&amp;Mehr</translation>
    </message>
    <message>
        <source>Shows or hides the settings that are seldom needed</source>
        <translation>Zeigt oder verbirgt, was selten gebraucht wird</translation>
    </message>
    <message>
        <source>No title</source>
        <translation>Kein Titel</translation>
    </message>
    <message>
        <source>Pictures</source>
        <translation>Bilder</translation>
    </message>
    <message>
        <source>Sound</source>
        <translation>Ton</translation>
    </message>
    <message>
        <source>&amp;Keep the chapters</source>
        <translation>&amp;Kapitel behalten</translation>
    </message>
    <message>
        <source>Pictures a seco&amp;nd</source>
        <translation>Bilder je Seku&amp;nde</translation>
    </message>
    <message>
        <source>Sound channels</source>
        <translation>Tonkanäle</translation>
    </message>
    <message>
        <source>HDR pictures</source>
        <translation>HDR-Bilder</translation>
    </message>
    <message>
        <source>Pictures with more light and colour than usual displays have.</source>
        <translation>Bilder mit mehr Licht und Farbe, als übliche Bildschirme zeigen.</translation>
    </message>
    <message>
        <source>Colour depth</source>
        <translation>Farbtiefe</translation>
    </message>
    <message>
        <source>Title</source>
        <translation>Titel</translation>
    </message>
    <message>
        <source>What players show as the movie&apos;s name.</source>
        <translation>Was Abspielprogramme als Namen des Films zeigen.</translation>
    </message>
    <message>
        <source>Characters of the subtitle files</source>
        <translation>Zeichen der Untertiteldateien</translation>
    </message>
    <message>
        <source>Convert</source>
        <translation>Umwandeln</translation>
    </message>
    <message>
        <source>As the source</source>
        <translation>Wie die Quelle</translation>
    </message>
    <message>
        <source>As the preset has it</source>
        <translation>Wie in der Vorlage</translation>
    </message>
    <message>
        <source>Mono</source>
        <translation>Mono</translation>
    </message>
    <message>
        <source>Stereo</source>
        <translation>Stereo</translation>
    </message>
    <message>
        <source>Kept where the format can</source>
        <translation>Bleiben, wo das Format es kann</translation>
    </message>
    <message>
        <source>Kept</source>
        <translation>Bleiben</translation>
    </message>
    <message>
        <source>Made usual pictures</source>
        <translation>Werden übliche Bilder</translation>
    </message>
    <message>
        <source>%1 bits</source>
        <translation>%1 Bit</translation>
    </message>
    <message>
        <source>What they look like</source>
        <translation>Wonach sie aussehen</translation>
    </message>
    <message>
        <source>Keep title, date and other texts</source>
        <translation>Titel und andere Te&amp;xte behalten</translation>
    </message>
    <message>
        <source>The sound stays as it is, and so do its channels.</source>
        <translation>Der Ton bleibt unverändert, und mit ihm seine Kanäle.</translation>
    </message>
</context>
<context>
    <name>movieconv::window::NamingDialog</name>
    <message>
        <source>&amp;Beside the source</source>
        <translation>&amp;Neben der Quelle</translation>
    </message>
    <message>
        <source>In this &amp;folder:</source>
        <translation>In diesem &amp;Ordner:</translation>
    </message>
    <message>
        <source>Names and folder of new files</source>
        <translation>Namen und Ordner neuer Dateien</translation>
    </message>
    <message>
        <source>Pattern of the names</source>
        <translation>Muster der Namen</translation>
    </message>
    <message>
        <source>{name}, {preset}, {height} and {date} are filled in.</source>
        <translation>{name}, {preset}, {height} und {date} werden ersetzt.</translation>
    </message>
    <message>
        <source>Folder for new files</source>
        <translation>Ordner für neue Dateien</translation>
    </message>
    <message>
        <source>C&amp;hoose…</source>
        <translation>&amp;Wählen …</translation>
    </message>
    <message>
        <source>Choose the folder for new files</source>
        <translation>Den Ordner für neue Dateien wählen</translation>
    </message>
    <message>
        <source>&amp;Name</source>
        <translation>N&amp;ame</translation>
    </message>
    <message>
        <source>Folder</source>
        <translation>Ordner</translation>
    </message>
    <message>
        <source>/Holidays/beach.mov</source>
        <translation>/Urlaub/Strand.mov</translation>
    </message>
    <message>
        <source>For example: %1</source>
        <translation>Zum Beispiel: %1</translation>
    </message>
</context>
<context>
    <name>movieconv::window::NoticeBar</name>
    <message>
        <source>Dismiss</source>
        <translation>Schließen</translation>
    </message>
    <message>
        <source>Dismiss the notice</source>
        <translation>Den Hinweis schließen</translation>
    </message>
</context>
<context>
    <name>movieconv::window::Notifier</name>
    <message>
        <source>Show</source>
        <translation>Zeigen</translation>
    </message>
</context>
<context>
    <name>movieconv::window::OverPage</name>
    <message>
        <source>Done</source>
        <translation>Fertig</translation>
    </message>
    <message>
        <source>Stopped</source>
        <translation>Abgebrochen</translation>
    </message>
    <message>
        <source>This did not work</source>
        <translation>Das hat nicht geklappt</translation>
    </message>
    <message>
        <source>Interrupted</source>
        <translation>Unterbrochen</translation>
    </message>
    <message>
        <source>%1 converted in %2 (%3)</source>
        <translation>%1 in %2 umgewandelt (%3)</translation>
    </message>
    <message numerus="yes">
        <source>%n files</source>
        <translation>
            <numerusform>eine Datei</numerusform>
            <numerusform>%n Dateien</numerusform>
        </translation>
    </message>
    <message>
        <source>&amp;Play the movie</source>
        <translation>Film ab&amp;spielen</translation>
    </message>
    <message>
        <source>Show in &amp;folder</source>
        <translation>Im &amp;Ordner zeigen</translation>
    </message>
    <message>
        <source>Convert &amp;again</source>
        <translation>&amp;Erneut umwandeln</translation>
    </message>
    <message>
        <source>What became of the movie</source>
        <translation>Was aus dem Film wurde</translation>
    </message>
    <message>
        <source>What was not carried over</source>
        <translation>Was nicht übernommen wurde</translation>
    </message>
    <message>
        <source>Puts the movie back into the queue.</source>
        <translation>Stellt den Film wieder in die Warteschlange.</translation>
    </message>
    <message>
        <source>State</source>
        <translation>Zustand</translation>
    </message>
    <message>
        <source>The program ended while this movie was being converted. Convert it again?</source>
        <translation>Das Programm endete, während dieser Film umgewandelt wurde. Noch einmal umwandeln?</translation>
    </message>
    <message>
        <source>The movie is in “%1”.</source>
        <translation>Der Film liegt in „%1“.</translation>
    </message>
    <message>
        <source>Not carried over:</source>
        <translation>Nicht übernommen:</translation>
    </message>
</context>
<context>
    <name>movieconv::window::PictureView</name>
    <message>
        <source>The picture that is being converted</source>
        <translation>Das Bild, das gerade umgewandelt wird</translation>
    </message>
</context>
<context>
    <name>movieconv::window::QueueView</name>
    <message>
        <source>Movies to convert</source>
        <translation>Filme zum Umwandeln</translation>
    </message>
</context>
<context>
    <name>movieconv::window::RangeChoice</name>
    <message>
        <source>Begin of the range</source>
        <translation>Anfang des Ausschnitts</translation>
    </message>
    <message>
        <source>End of the range</source>
        <translation>Ende des Ausschnitts</translation>
    </message>
    <message>
        <source>f&amp;rom</source>
        <translation>v&amp;on</translation>
    </message>
    <message>
        <source>&amp;to</source>
        <translation>b&amp;is</translation>
    </message>
    <message>
        <source>Hours, minutes and seconds, such as 1:02:03</source>
        <translation>Stunden, Minuten und Sekunden, etwa 1:02:03</translation>
    </message>
</context>
<context>
    <name>movieconv::window::RangeStrip</name>
    <message>
        <source>Range</source>
        <translation>Ausschnitt</translation>
    </message>
    <message>
        <source>B and E choose the begin or the end, the arrow keys move it by a second.</source>
        <translation>B und E wählen Anfang oder Ende, die Pfeiltasten bewegen es um eine Sekunde.</translation>
    </message>
    <message>
        <source>Drag the ends to convert a part of the movie.</source>
        <translation>Die Enden ziehen, um einen Teil des Films umzuwandeln.</translation>
    </message>
</context>
<context>
    <name>movieconv::window::SleepGuard</name>
    <message>
        <source>Movies are being converted</source>
        <translation>Es werden Filme umgewandelt</translation>
    </message>
    <message>
        <source>The machine may go to sleep while movies are converted: %1</source>
        <translation>Der Rechner könnte während der Umwandlung einschlafen: %1</translation>
    </message>
</context>
<context>
    <name>movieconv::window::SubtitleFiles</name>
    <message>
        <source>&amp;Add a subtitle file…</source>
        <translation>Untertitel&amp;datei hinzufügen …</translation>
    </message>
    <message>
        <source>Language of %1</source>
        <translation>Sprache von %1</translation>
    </message>
    <message>
        <source>Language not told</source>
        <translation>Sprache unbekannt</translation>
    </message>
    <message>
        <source>Leave this file out</source>
        <translation>Diese Datei weglassen</translation>
    </message>
    <message>
        <source>Leave %1 out</source>
        <translation>%1 weglassen</translation>
    </message>
    <message>
        <source>Add subtitles</source>
        <translation>Untertitel hinzufügen</translation>
    </message>
</context>
<context>
    <name>movieconv::window::TargetChoice</name>
    <message>
        <source>Choos&amp;e…</source>
        <translation>Wäh&amp;len …</translation>
    </message>
    <message>
        <source>Replace the file that e&amp;xists</source>
        <translation>Die vorhandene Datei ers&amp;etzen</translation>
    </message>
    <message>
        <source>File to save as</source>
        <translation>Datei, in die gespeichert wird</translation>
    </message>
    <message>
        <source>By the naming rules</source>
        <translation>Nach den Namensregeln</translation>
    </message>
    <message>
        <source>Back to the naming rules</source>
        <translation>Zurück zu den Namensregeln</translation>
    </message>
    <message>
        <source>Choose the file to save as</source>
        <translation>Die Datei wählen, in die gespeichert wird</translation>
    </message>
    <message>
        <source>Warnings</source>
        <translation>Warnungen</translation>
    </message>
    <message>
        <source>Notes</source>
        <translation>Hinweise</translation>
    </message>
    <message>
        <source>Save as</source>
        <translation>Speichern als</translation>
    </message>
    <message>
        <source>Another movie in the queue goes there as well. Choose another name.</source>
        <translation>Ein anderer Film der Warteschlange geht auch dorthin. Bitte einen anderen Namen wählen.</translation>
    </message>
</context>
<context>
    <name>movieconv::window::TrackChoice</name>
    <message>
        <source>All</source>
        <translation>Alle</translation>
    </message>
    <message>
        <source>None</source>
        <translation>Keine</translation>
    </message>
</context>
<context>
    <name>movieconv::window::WorkPage</name>
    <message>
        <source>S&amp;top</source>
        <translation>Ab&amp;brechen</translation>
    </message>
    <message>
        <source>Progress of the movie</source>
        <translation>Fortschritt des Films</translation>
    </message>
    <message>
        <source>Pauses or resumes this movie</source>
        <translation>Hält diesen Film an oder setzt ihn fort</translation>
    </message>
    <message>
        <source>Stops this movie; what is converted is kept.</source>
        <translation>Bricht diesen Film ab; was fertig ist, bleibt.</translation>
    </message>
    <message>
        <source>Progress in percent</source>
        <translation>Fortschritt in Prozent</translation>
    </message>
    <message>
        <source>What happens now</source>
        <translation>Was gerade geschieht</translation>
    </message>
    <message>
        <source>Time left</source>
        <translation>Restzeit</translation>
    </message>
    <message>
        <source>Speed</source>
        <translation>Geschwindigkeit</translation>
    </message>
    <message>
        <source>Converted</source>
        <translation>Umgewandelt</translation>
    </message>
    <message>
        <source>Written</source>
        <translation>Geschrieben</translation>
    </message>
    <message>
        <source>%1 %</source>
        <translation>%1 %</translation>
    </message>
    <message>
        <source>%1 of %2</source>
        <translation>%1 von %2</translation>
    </message>
    <message>
        <source>&amp;Resume</source>
        <translation>&amp;Fortsetzen</translation>
    </message>
    <message>
        <source>&amp;Pause</source>
        <translation>An&amp;halten</translation>
    </message>
    <message>
        <source>%1 of %2 to %3</source>
        <translation>%1 von %2 bis %3</translation>
    </message>
</context>
</TS>
