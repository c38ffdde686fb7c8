// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT

/// The numbers that the catalogue's messages carry, each used by one call.
#ifndef MEDIIDX_DATABASE_CATALOGUE_LINES_H_
#define MEDIIDX_DATABASE_CATALOGUE_LINES_H_

namespace mediidx::catalogue {

enum Line : int {
  kBadParametersLine = 600,

  kTrackGenreCopyLine = 610,
  kTrackInsertLine = 611,
  kVirtualTrackInsertLine = 612,
  kTrackUpdateLine = 613,
  kTrackIdLine = 614,
  kCounterpartsLine = 615,
  kHasVirtualLine = 616,
  kPropertiesToVirtualLine = 617,
  kPropertiesFromActualLine = 618,

  kGenreCopyLine = 630,
  kGenreInsertLine = 631,
  kOneGenreLine = 632,
  kComposerInsertLine = 633,
  kArtistInsertLine = 634,
  kVirtualInfoInsertLine = 635,
  kReplayGainInsertLine = 636,
  kPersonalDirectoryLine = 637,

  kRatingHashLine = 640,
  kRatingReadLine = 641,
  kRatingInsertLine = 642,

  kAlbumInsertLine = 650,
  kCollapseTestLine = 651,
  kCollapseLine = 652,
  kCollapseTestFailedLine = 653,
  kCollapseFailedLine = 654,
  kTaggedAlbumFailedLine = 655,
  kCollapsedAlbumFailedLine = 656,
  kSingleAlbumFailedLine = 657,

  kMemberTestLine = 660,
  kCueMemberTestLine = 661,
  kRemainingArtistsLine = 662,
  kCueRemainingArtistsLine = 663,
  kRecoveryLine = 664,
  kCueRecoveryLine = 665,
  kMemberTestFailedLine = 666,
  kRemainingArtistsFailedLine = 667,
  kRecoveryFailedLine = 668,

  kInsertTrackFailedLine = 670,
  kFindIdFailedLine = 671,
  kFindCounterpartsFailedLine = 672,
  kHasVirtualFailedLine = 673,
  kPropertiesFailedLine = 674,
  kInsertGenreFailedLine = 675,
  kInsertComposerFailedLine = 676,
  kInsertArtistFailedLine = 677,
  kInsertVirtualInfoFailedLine = 678,
  kInsertRatingFailedLine = 679,
  kUpdateTrackFailedLine = 680,
  kDeleteRelatedFailedLine = 681,
  kRecoverAlbumFailedLine = 682,
  kSideRowsDeleteLine = 683,
};

}  // namespace mediidx::catalogue

#endif
