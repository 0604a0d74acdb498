# System libraries as imported targets. Their headers are SYSTEM so that our warnings stay ours.
find_package(PkgConfig REQUIRED)
find_package(Threads REQUIRED)

# Some .pc files name include directories that the packages do not ship; drop those.
function(mewlo_pkg name)
  pkg_check_modules(${name} REQUIRED IMPORTED_TARGET ${ARGN})
  get_target_property(dirs PkgConfig::${name} INTERFACE_INCLUDE_DIRECTORIES)
  set(found "")
  if(dirs)
    foreach(dir IN LISTS dirs)
      if(EXISTS "${dir}")
        list(APPEND found "${dir}")
      endif()
    endforeach()
  endif()
  set_target_properties(PkgConfig::${name} PROPERTIES
    INTERFACE_INCLUDE_DIRECTORIES "${found}" INTERFACE_SYSTEM_INCLUDE_DIRECTORIES "${found}")
endfunction()

mewlo_pkg(EFL elementary edje evas ecore ecore-evas ecore-file ecore-x ecore-input eina efreet)
mewlo_pkg(ECORE ecore ecore-file eina evas)
mewlo_pkg(CAIRO cairo)
mewlo_pkg(GLIB glib-2.0)
mewlo_pkg(ICU icu-i18n icu-uc)
mewlo_pkg(GST gstreamer-1.0 gstreamer-base-1.0 gstreamer-audio-1.0)
mewlo_pkg(PULSE libpulse)
mewlo_pkg(SQLITE sqlite3)
mewlo_pkg(SYSTEMD libsystemd)
mewlo_pkg(X11 x11 xext xscrnsaver)

find_program(EDJE_CC edje_cc REQUIRED)
find_program(RSVG_CONVERT rsvg-convert REQUIRED)
find_program(MSGFMT msgfmt REQUIRED)
