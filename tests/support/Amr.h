#pragma once

#include <cstdlib>
#include <string>

#include "support/TempDir.h"

namespace support {

// Encodes a file of waves.
inline bool encodeAmr(const std::string& from, const std::string& to)
{
    const std::string command = "gst-launch-1.0 -q filesrc location='" + from
        + "' ! wavparse ! audioconvert ! audioresample ! audio/x-raw,rate=8000,channels=1 ! amrnbenc ! filesink "
          "location='"
        + to + ".frames'";
    if (std::system(command.c_str()) != 0)
        return false;
    const std::string frames = readFile(to + ".frames");
    writeFile(to, frames.starts_with("#!AMR") ? frames : "#!AMR\n" + frames);
    return true;
}

// Noise of that many seconds.
inline bool makeAmr(const std::string& to, int seconds)
{
    const std::string command = "ffmpeg -v error -y -f lavfi -i anoisesrc=d=" + std::to_string(seconds)
        + ":r=8000:a=0.4 -ac 1 '" + to + ".wav'";
    return std::system(command.c_str()) == 0 && encodeAmr(to + ".wav", to);
}

// Wide-band silence, 20 ms a frame.
inline std::string wideAmr(int frames)
{
    std::string content = "#!AMR-WB\n";
    for (int i = 0; i < frames; ++i)
        content += '\4' + std::string(17, '\0');
    return content;
}

}
