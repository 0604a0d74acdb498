// Elementary set up for an application that brings its own view of the desktop.
#pragma once

namespace platform {

// What the toolkit reads from the environment; values of the user stay.
void prepareToolkitEnvironment();
bool startToolkit(int argc, char** argv);
void stopToolkit();

// The main window; borrowed. Raising also brings it back from the taskbar.
void setMainWindow(void* window);
void* mainWindow();
void raiseMainWindow();

}
