#pragma once

// Where the bars of the trim panel stand and what of the recording they leave: the arithmetic of the panel, without any
// object of the toolkit. Times are milliseconds; places are pixels from the left edge of the touch area, which begins
// one side bar before the waveform and ends one behind it.
class MwTrimRange {
public:
    enum Press : int { NONE, START_TRIM_BAR_PRESSED, END_TRIM_BAR_PRESSED, PLAY_POSITION_BAR_PRESSED };
    struct Geometry {
        double waveform = 0; // width
        double sideBar = 0;
        double playBar = 0;
    };
    static constexpr unsigned int SHORTEST = 1000;

    // The whole of a recording.
    explicit MwTrimRange(unsigned int duration = 0);

    // The bars keep their times.
    void setGeometry(const Geometry& geometry) { _geometry = geometry; }
    [[nodiscard]] const Geometry& getGeometry() const { return _geometry; }
    [[nodiscard]] unsigned int getDuration() const { return _duration; }
    [[nodiscard]] unsigned int getBegin() const { return _trimBegin; }
    [[nodiscard]] unsigned int getEnd() const { return _trimEnd; }
    [[nodiscard]] bool isTrimmed() const { return _trimBegin != 0 || _trimEnd != _duration; }

    // Left edges of the bars.
    [[nodiscard]] double getStartX() const;
    [[nodiscard]] double getEndX() const;
    [[nodiscard]] double getPlayX(unsigned int position) const;

    // Which bar a finger takes.
    [[nodiscard]] Press press(double x, unsigned int position) const;
    void moveStart(double pixels);
    void moveEnd(double pixels);
    // Answers the new position.
    [[nodiscard]] unsigned int movePlay(unsigned int position, double pixels) const;
    // As far as the other bar allows.
    void setBegin(long long time);
    void setEnd(long long time);
    [[nodiscard]] unsigned int confine(long long position) const;

    // How much of a finger's way a bar goes: all of it, less the further the finger is off the waveform (pixels) or the
    // slower it goes (pixels a second), as far as the recording is long enough for that to matter.
    [[nodiscard]] double stepOf(double away, double speed) const;

private:
    [[nodiscard]] double _timeOf(double pixels) const;

    unsigned int _duration;
    unsigned int _trimBegin = 0;
    unsigned int _trimEnd;
    Geometry _geometry;
};
