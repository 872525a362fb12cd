#include "support/TestPlatform.h"

namespace nimbo {

TestPlatform::TestPlatform(KeyedArchive* archiveInForce, Compressor* compressorInForce)
    : platform({time, loop, log, signposts, random, strings, settings, favorites, transitLines, network, memoryPressure,
                activityLauncher, analytics, deviceLockState, archiveInForce ? *archiveInForce : archive,
                compressorInForce ? *compressorInForce : compressor, images, text, shieldRenderer}) {}

TestPlatform::~TestPlatform() {
  // What queued work holds goes while the platform is still in force.
  loop.clear();
}

Date TestPlatform::startDate() { return *dateFromISOText("2026-01-05T12:00:00Z"); }

}  // namespace nimbo
