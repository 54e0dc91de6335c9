#pragma once

#include <cstdint>

// The bits of a channel's flag word and of a folder's fold flags. They reach documents: never renumber them.
//
// "State" bits are compared with the saved defaults, enter digests and announce `kModifyState`; the others are in
// `kChannelNonStateFlags`. Bits without a name have no effect here, are state, and are stored like the others.

using KFChannelFlags = unsigned long long;

inline constexpr KFChannelFlags kChannelFlagObjectSelected = 0x1; ///< Of an object root. Not state.
inline constexpr KFChannelFlags kChannelFlagHidden = 0x2;
inline constexpr KFChannelFlags kChannelFlagLocked = 0x4;   ///< The channel refuses changes of its data.
inline constexpr KFChannelFlags kChannelFlagNotSaved = 0x8; ///< A folder doesn't write this child. Not state.
inline constexpr KFChannelFlags kChannelFlagHostOption4 = 0x10; ///< Set by every constructor. Not state.
inline constexpr KFChannelFlags kChannelFlagHostOption5 = 0x20; ///< Not state.
inline constexpr KFChannelFlags kChannelFlagNameUnset =
    0x40; ///< The name isn't a chosen one; never in a document. Not state.
inline constexpr KFChannelFlags kChannelFlagExcludedFromHash = 0x80;
inline constexpr KFChannelFlags kChannelFlagHostOption11 = 0x800;
inline constexpr KFChannelFlags kChannelFlagIsFolder =
    0x1000; ///< Set by the folder's constructors only. Not state.
inline constexpr KFChannelFlags kChannelFlagIsObjectRoot =
    0x2000; ///< Set by the root's constructors only. Not state.
/// What a channel is. Walks of the tree cast by these bits, so neither copying nor reading changes them.
inline constexpr KFChannelFlags kChannelClassFlags = kChannelFlagIsFolder | kChannelFlagIsObjectRoot;
inline constexpr KFChannelFlags kChannelFlagDisabled = 0x8000;
inline constexpr KFChannelFlags kChannelFlagTimeIndependent = 0x10000; ///< Not state.
inline constexpr KFChannelFlags kChannelFlagNotRetimed = 0x20000;      ///< Not state.
inline constexpr KFChannelFlags kChannelFlagSolo = 0x40000;
inline constexpr KFChannelFlags kChannelFlagSoloable = 0x80000;   ///< Not state.
inline constexpr KFChannelFlags kChannelFlagChildSolo = 0x100000; ///< A descendant is soloed. Not state.
inline constexpr KFChannelFlags kChannelFlagPathDerivationOff = 0x200000;
inline constexpr KFChannelFlags kChannelFlagHostOption22 = 0x400000;  ///< Not state.
inline constexpr KFChannelFlags kChannelFlagHostOption24 = 0x1000000; ///< Not state.
inline constexpr KFChannelFlags kChannelFlagHostOption25 = 0x2000000; ///< Not state.
inline constexpr KFChannelFlags kChannelFlagRootInFullName = 0x4000000;
inline constexpr KFChannelFlags kChannelFlagOverRange = 0x8000000;
inline constexpr KFChannelFlags kChannelFlagHostOption28 = 0x10000000; ///< Not state.
inline constexpr KFChannelFlags kChannelFlagBehaviorsOff =
    0x80000000; ///< Values are read without processing nodes.
inline constexpr KFChannelFlags kChannelFlagSaveWhenAtDefault = 0x100000000;
inline constexpr KFChannelFlags kChannelFlagInitialized = 0x200000000; ///< Not state.
inline constexpr KFChannelFlags kChannelFlagFadesOff =
    0x800000000; ///< Values are read without the fade ratio.
inline constexpr KFChannelFlags kChannelFlagKeepOnFolderReset = 0x20000000000;

/// Bits 0, 3, 4, 5, 6, 12, 13, 16, 17, 19, 20, 22, 24, 25, 28, 33.
inline constexpr KFChannelFlags kChannelNonStateFlags = 0x2135B3079;
/// Bits 3, 4, 7, 11, 12, 13, 17, 19, 27, 33: a folder keeps those of the constructed child when it reads flags.
inline constexpr KFChannelFlags kChannelParsePreservedFlags = 0x2080A3898;

inline constexpr std::uint32_t kFoldFlagsCompoundDefault = 0xF;
inline constexpr std::uint32_t kFoldFlagModifiedIsEnabled = 0x20000;
inline constexpr std::uint32_t kFoldFlagLinked =
    0x100000; ///< The children of a compound are edited together.
inline constexpr std::uint32_t kFoldFlagChildrenNotSaved = 0x1000000;
inline constexpr std::uint32_t kFoldFlagStateCopyOwnsChildren = 0x80000000;
/// Bits 0 to 3, 13, 17, 23.
inline constexpr std::uint32_t kFoldNonStateFlags = 0x82200F;

/// What `willBeModified` announces: a change of value, keyframes, name or fold flags; a change of enabled, locked,
/// solo or state flags.
inline constexpr unsigned int kModifyData = 1;
inline constexpr unsigned int kModifyState = 2;

/// IDs from this one up are handed out by the process-wide generator; those from `kFirstForeignChannelID` up lie
/// outside its reach.
inline constexpr unsigned int kFirstDynamicChannelID = 10000;
inline constexpr unsigned int kFirstForeignChannelID = 3500000000;
