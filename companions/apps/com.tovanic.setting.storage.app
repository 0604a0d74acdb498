[Application]
Name=Storage
Exec=xdg-open %d
Reply=none
