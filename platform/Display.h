#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>

#include <ui/Rect.h>

#include "platform/Picture.h"

/**
 * The device's internal display, behind the platform's capture calls. It shows one colour, or a
 * picture of its own size. It starts black, with 1080 x 2400 pixels. All content counts as secure.
 *
 * The display belongs to the device, not to a process. Processes forked after `shareDisplay` see
 * one display, whichever of them changes it. Only one of them at a time may use it. Within a
 * process all functions may be called from any thread.
 */
namespace platform {

/** What makes captures fail. */
enum class DisplayFault {
    kNone,
    kToken,      // the display has no token
    kCapture,    // captures are refused
    kResults,    // captures complete without success
    kLock,       // captured buffers cannot be locked
    kListener,   // captures are refused, as the listener is told; the call succeeds
    kTwice,      // captures complete twice: first for lack of memory, then with a buffer
    kNoDisplay,  // there is no display
    kFence,      // the fence of a captured buffer signals an error
};

struct DisplaySize {
    uint32_t width;  // pixels, at least 1
    uint32_t height;
};

struct Color {
    uint8_t red;
    uint8_t green;
    uint8_t blue;
};

/** A change of the display. What has no value stays as it was. */
struct DisplayChange {
    // Either of these ends a picture. The display then shows the last colour.
    std::optional<DisplaySize> size;
    std::optional<Color> color;

    // Not together with the two above. The display takes the picture's size.
    std::optional<Picture> picture;

    std::optional<uint32_t> rowPadding;  // pixels behind each row of a captured buffer
    std::optional<DisplayFault> fault;
};

/**
 * Shares the display with the processes that are forked from now on. Returns nothing, or why that
 * failed: one line.
 */
std::optional<std::string> shareDisplay();

/**
 * Changes the display. Returns nothing, or why the picture cannot be shown: one line. Nothing has
 * changed then.
 */
std::optional<std::string> changeDisplay(const DisplayChange& change);

DisplayFault displayFault();
DisplaySize displaySize();
uint32_t displayRowPadding();

/** Prepares `copyDisplay` for what the display shows now. Returns false if memory is lacking. */
bool mapDisplay();

/**
 * Copies the pixels of `area` to `pixels`, 4 bytes each as in `Picture`, with `rowBytes` from one
 * row's begin to the next. Leaves out what lies outside the display. Copies nothing where
 * `mapDisplay` would fail.
 */
void copyDisplay(const android::Rect& area, uint8_t* pixels, size_t rowBytes);

}  // namespace platform
