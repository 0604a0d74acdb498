[Application]
Name=Voice Recorder
Exec=mewlo-lite
Operations=com.tovanic.operation/create_content;
Reply=protocol
