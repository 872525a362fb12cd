#pragma once

#include <gmock/gmock.h>

#include "platform/Platform.h"
#include "platform/VirtualTime.h"
#include "support/ArchiveDouble.h"
#include "support/DrawingDoubles.h"
#include "support/SmallDoubles.h"
#include "support/TestRunLoop.h"
#include "support/TransitFixtures.h"

namespace nimbo {

/// A platform in memory, in force while it lives: each service is a double that the test reaches by its member. The
/// thread that makes it is the main thread; the clock starts at 2026-01-05T12:00:00Z and stands still until told.
class TestPlatform final {
 public:
  /// The given archive and compressor, where there are any, replace the doubles; they outlive this.
  explicit TestPlatform(KeyedArchive* archiveInForce = nullptr, Compressor* compressorInForce = nullptr)
      : platform({time, loop, log, signposts, random, strings, settings, favorites, transitLines, network,
                  memoryPressure, activityLauncher, analytics, deviceLockState,
                  archiveInForce ? *archiveInForce : archive, compressorInForce ? *compressorInForce : compressor,
                  images, text, shieldRenderer}) {}
  /// What queued work holds goes while the platform is still in force.
  ~TestPlatform() { loop.clear(); }

  /// The date at which the clock starts.
  static Date startDate() { return *dateFromISOText("2026-01-05T12:00:00Z"); }

  VirtualTime time{startDate()};
  TestRunLoop loop{time};
  RecordingLog log;
  RecordingSignposts signposts;
  ScriptedRandomSource random;
  StringTablesDouble strings;
  MemorySettings settings;
  FavoritesDouble favorites;
  TransitLineServiceDouble transitLines{loop};
  NetworkFailureDiagnosisDouble network;
  MemoryPressureDouble memoryPressure;
  ActivityLauncherDouble activityLauncher{loop};
  RecordingAnalyticsPipeline analytics;
  DeviceLockStateDouble deviceLockState;
  ArchiveDouble archive;
  CompressorDouble compressor;
  ImageResourcesDouble images;
  TextSystemDouble text;
  std::shared_ptr<ShieldRendererDouble> shieldRenderer = std::make_shared<ShieldRendererDouble>();
  Platform platform;
};

}  // namespace nimbo
