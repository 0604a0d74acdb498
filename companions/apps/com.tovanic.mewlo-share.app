[Application]
Name=Share recordings
Exec=mewlo-share
Operations=com.tovanic.operation/share;com.tovanic.operation/multi_share;
Reply=protocol
