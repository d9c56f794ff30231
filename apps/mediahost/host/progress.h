#pragma once

#include <orv/devMDProperty.h>
#include <string>

namespace MediaHost {

class Host;

/// Shows how far the show is: on a terminal as a bar that is drawn over and over, elsewhere as a
/// line each second.
class Progress {
public:
    explicit Progress(Host& host);
    ~Progress();  ///< Ends the line that the bar is in.

    Progress(const Progress&) = delete;
    Progress& operator=(const Progress&) = delete;

    void show();

private:
    Host& _host;
    const bool _isTerminal;
    Orv::RCShdPtr<Orv::DevMDProperty<std::int64_t>> _position;  // null without pictures
    double _rate = 0;                                           // of the pictures
    double _duration = 0;                                       // seconds; 0: unknown
    double _nextSeconds = 0;
    bool _isBarOpen = false;

    std::string makeText(std::int64_t position) const;
};

}  // namespace MediaHost
