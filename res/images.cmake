# The images of edje/MwImages.edj: name, drawing, size in design units (one unit is one pixel at twice the size).
set(MEWLO_IMAGES
  mainView/full_player_button_next.png next 64
  mainView/full_player_button_pause.png pause 64
  mainView/full_player_button_play.png play 64
  mainView/full_player_button_prev.png prev 64
  mainView/full_player_button_stop.png stop 80
  mainView/voice_bookmark_icon.png bookmark_marker 48
  mainView/voice_btn_bg_rec.png disc 200
  mainView/voice_btn_rec.png mic 88
  mainView/voice_icon_bookmark.png bookmark 52
  mainView/voice_icon_bookmark_02.png bookmark_marker 48
  mainView/voice_icon_cancel.png close 52
  mainView/voice_icon_pause.png pause 52
  mainView/voice_icon_recordings.png list 52
  mainView/voice_icon_save.png check 52
  mainView/voice_icon_trim.png scissors 52
  mainView/voice_list_ic_bookmark.png bookmark 49
  mainView/voice_list_ic_private.png lock 49
  miniLockscreen/ls_controller_btn_next_02.png next 64
  miniLockscreen/ls_controller_btn_pause.png pause 64
  miniLockscreen/ls_controller_btn_play.png play 64
  miniLockscreen/ls_controller_btn_pre_02.png prev 64
  miniLockscreen/ls_controller_btn_stop.png stop 64
  miniLockscreen/player_Power_bg.png disc 120
  miniLockscreen/player_button_recorder.png mic 64
  miniNotification/album_default_recorder.png album 120
  miniNotification/player_button_bg.png disc 96
  miniNotification/player_button_next.png next 56
  miniNotification/player_button_pause.png pause 56
  miniNotification/player_button_play.png play 56
  miniNotification/player_button_prev.png prev 56
  miniNotification/player_button_recorder.png mic 56
  miniNotification/player_button_recorder_bg.png disc 96
  miniNotification/recorder_player_button_pause.png pause 56
  miniNotification/recorder_player_button_stop.png stop 56)

# The images that the layouts use themselves.
set(MEWLO_LAYOUT_IMAGES
  look/back.png back 56
  look/bookmark.png bookmark 44
  look/call_rejected.png call_rejected 52
  look/check.png check 52
  look/circle_hairline.png circle_hairline 400
  look/circle_outline.png circle_outline 200
  look/close.png close 56
  look/disc.png disc 200
  look/mic.png mic 120
  look/more.png more 56
  look/round.png round 64
  look/round_outline.png round_outline 64
  look/spinner.png spinner 112)
