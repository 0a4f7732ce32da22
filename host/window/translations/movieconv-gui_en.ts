<?xml version="1.0" encoding="utf-8"?>
<!DOCTYPE TS>
<TS version="2.1" language="en" sourcelanguage="en">
<context>
    <name>Words</name>
    <message numerus="yes">
        <source>about %n minutes</source>
        <translation>
            <numerusform>about one minute</numerusform>
            <numerusform>about %n minutes</numerusform>
        </translation>
    </message>
</context>
<context>
    <name>movieconv::window::App</name>
    <message numerus="yes">
        <source>%n movies were converted.</source>
        <translation>
            <numerusform>One movie was converted.</numerusform>
            <numerusform>%n movies were converted.</numerusform>
        </translation>
    </message>
    <message numerus="yes">
        <source>%n could not be converted.</source>
        <translation>
            <numerusform>One could not be converted.</numerusform>
            <numerusform>%n could not be converted.</numerusform>
        </translation>
    </message>
</context>
<context>
    <name>movieconv::window::EntryPage</name>
    <message numerus="yes">
        <source>Of %n minutes</source>
        <translation>
            <numerusform>Of one minute</numerusform>
            <numerusform>Of %n minutes</numerusform>
        </translation>
    </message>
</context>
<context>
    <name>movieconv::window::LogPanel</name>
    <message numerus="yes">
        <source>&amp;Log (%n lines)</source>
        <translation>
            <numerusform>&amp;Log (one line)</numerusform>
            <numerusform>&amp;Log (%n lines)</numerusform>
        </translation>
    </message>
</context>
<context>
    <name>movieconv::window::MainWindow</name>
    <message numerus="yes">
        <source>%n movies were being converted when the program ended.</source>
        <translation>
            <numerusform>One movie was being converted when the program ended.</numerusform>
            <numerusform>%n movies were being converted when the program ended.</numerusform>
        </translation>
    </message>
    <message numerus="yes">
        <source>%n failed</source>
        <translation>
            <numerusform>one failed</numerusform>
            <numerusform>%n failed</numerusform>
        </translation>
    </message>
    <message numerus="yes">
        <source>%n movies are ready</source>
        <translation>
            <numerusform>One movie is ready</numerusform>
            <numerusform>%n movies are ready</numerusform>
        </translation>
    </message>
    <message numerus="yes">
        <source>%n movies</source>
        <translation>
            <numerusform>One movie</numerusform>
            <numerusform>%n movies</numerusform>
        </translation>
    </message>
</context>
<context>
    <name>movieconv::window::OverPage</name>
    <message numerus="yes">
        <source>%n files</source>
        <translation>
            <numerusform>one file</numerusform>
            <numerusform>%n files</numerusform>
        </translation>
    </message>
</context>
</TS>
