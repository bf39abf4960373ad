#include "core/TallyCommon.h"

#include <ctime>
#include <limits>
#include <utility>

#include <unistd.h>

#include "core/Log.h"
#include "platform/PropertyService.h"
#include "tests/DeviceTest.h"

namespace {

/** How often the library napped; the boot animation ends during the fifth nap. */
int naps = 0;

}  // namespace

/**
 * The library's only sleep wakes at once here, so that no test waits. Others are those of SQLite,
 * which lets another process go on.
 */
extern "C" int usleep(useconds_t us) {
    if (us != 200'000) {
        const timespec time{0, static_cast<long>(us) * 1000};
        return nanosleep(&time, nullptr);
    }
    constexpr const char* kStates[] = {"0", "unkown", "2", "-1", " 1x"};
    platform::setDeviceProperty("service.bootanim.exit", kStates[naps++]);
    return 0;
}

namespace android {
namespace {

class TallyCommonTest : public DeviceTest {
protected:
    TallyCommon* const mTally = TallyCommon::getInstance();
};

TEST_F(TallyCommonTest, SendsPairsInBytewiseOrderOfTheirKeysUnescaped) {
    mTally->trackEvent("N273|10013", {{"a", "1:2&3"}, {"Z", ""}, {"9", "nine"}, {"10", "ten"}});
    mTally->trackEvent("N273|10009", {{"count", "3"}});
    EXPECT_EQ(taken(), (Lines{"0 N273|10013 10:ten&9:nine&Z:&a:1:2&3", "0 N273|10009 count:3"}));
    EXPECT_EQ(mTally->convertMapToTally({}), "");
}

TEST_F(TallyCommonTest, NamesAnEventInTheLogBeforeItIsSentWhileTheLogIsOn) {
    for (const int isOn : {0, 1, -2}) {
        mLogSwitch = isOn;
        mTally->setTally({"N273|1", "x"});
        Lines expected{"0 log 6 SDC Event = N273|1", "0 N273|1 x"};
        if (isOn == 0) expected.erase(expected.begin());
        EXPECT_EQ(taken(), expected) << isOn;
    }
}

TEST_F(TallyCommonTest, WritesEveryNumberInDecimal) {
    EXPECT_EQ(mTally->intToStr(std::numeric_limits<int>::min()), "-2147483648");
    EXPECT_EQ(mTally->intToStr(std::numeric_limits<int>::max()), "2147483647");
    EXPECT_EQ(mTally->longToStr(0), "0");
    for (const long value : {std::numeric_limits<long>::min(), -1L}) {
        EXPECT_EQ(mTally->longToStr(value), std::to_string(value));
    }
}

TEST_F(TallyCommonTest, CutsATextAtItsDelimiterAndKeepsEmptyPieces) {
    const std::vector<std::tuple<std::string, std::string, Lines>> cases{
            {"1_2__3", "_", {"1", "2", "", "3"}},
            {"1_2_", "_", {"1", "2", ""}},
            {"_", "_", {"", ""}},
            {"", "_", {""}},
            {"abc", "_", {"abc"}},
            {"a_b", "", {"a_b"}},
            // A delimiter of several characters is looked for by any of them the first time.
            {"a-b<->c", "<->", {"a", "->c"}},
            {"a>", "<->", {"a", ""}},
    };
    for (const auto& [text, delimiter, expected] : cases) {
        Lines pieces{"old"};
        mTally->splitStr(text, delimiter, pieces);
        EXPECT_EQ(pieces, expected) << '"' << text << "\" at \"" << delimiter << '"';
    }
}

TEST_F(TallyCommonTest, CutsATextThatLiesWhereThePiecesGoAsItsDelimiterMay) {
    const std::string kLong(100, 'x');
    Lines pieces{kLong + "_" + kLong, "_"};
    mTally->splitStr(pieces[0], pieces[1], pieces);
    EXPECT_EQ(pieces, (Lines{kLong, kLong}));
    mTally->splitStr("1" + kLong + "2", pieces[1], pieces);
    EXPECT_EQ(pieces, (Lines{"1", "2"}));
}

TEST_F(TallyCommonTest, WaitsForTheEndOfTheBootAnimationOnce) {
    mTally->BootNotFinish();
    EXPECT_EQ(naps, 5);
    setProperty("service.bootanim.exit", "0");
    mTally->BootNotFinish();
    EXPECT_EQ(naps, 5);
}

}  // namespace
}  // namespace android
