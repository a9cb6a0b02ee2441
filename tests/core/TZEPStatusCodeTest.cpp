// SPDX-License-Identifier: Apache-2.0
#include "TZEPStatusCode.h"

#include "TBoostAssertException.h"
#include "TZEPException.h"

#include <gtest/gtest.h>

#include <type_traits>

namespace NQRVZEP20 {
namespace {

struct TRow {
  int fValue;
  EZEPStatusCode fCode;
  char const* fName;
};

TRow const kAllCodes[] = {
    {0, kZEPStatusOK, "kZEPStatusOK"},
    {1, kZEPStatusNotImplemented, "kZEPStatusNotImplemented"},
    {2, kZEPStatusUnknownClass, "kZEPStatusUnknownClass"},
    {3, kZEPStatusFail, "kZEPStatusFail"},
    {4, kZEPStatusOutOfMemory, "kZEPStatusOutOfMemory"},
    {5, kZEPStatusNoMoreItems, "kZEPStatusNoMoreItems"},
    {6, kZEPStatusErrorCollectingClass, "kZEPStatusErrorCollectingClass"},
    {7, kZEPStatusInvalidClass, "kZEPStatusInvalidClass"},
    {8, kZEPStatusInvalidProperty, "kZEPStatusInvalidProperty"},
    {9, kZEPStatusInvalidSpecificationDocument, "kZEPStatusInvalidSpecificationDocument"},
    {10, kZEPStatusInvalidDataCollectionDocument, "kZEPStatusInvalidDataCollectionDocument"},
    {11, kZEPStatusFileSystemError, "kZEPStatusFileSystemError"},
    {12, kZEPStatusDirectoryAlreadyExists, "kZEPStatusDirectoryAlreadyExists"},
    {13, kZEPStatusNotArray, "kZEPStatusNotArray"},
    {14, kZEPStatusTypeMismatch, "kZEPStatusTypeMismatch"},
    {15, kZEPStatusNotFound, "kZEPStatusNotFound"},
    {16, kZEPStatusAlreadyExists, "kZEPStatusAlreadyExists"},
    {17, kZEPStatusInvalidOpSequence, "kZEPStatusInvalidOpSequence"},
    {18, kZEPStatusInvalidInstance, "kZEPStatusInvalidInstance"},
    {19, kZEPStatusCorruptedContainer, "kZEPStatusCorruptedContainer"},
    {20, kZEPStatusInvalidPlugin, "kZEPStatusInvalidPlugin"},
    {21, kZEPStatusInvalidDateTime, "kZEPStatusInvalidDateTime"},
    {22, kZEPStatusNotAssociation, "kZEPStatusNotAssociation"},
    {23, kZEPStatusNotReference, "kZEPStatusNotReference"},
    {24, kZEPStatusInvalidReference, "kZEPStatusInvalidReference"},
    {25, kZEPStatusInvalidCIMName, "kZEPStatusInvalidCIMName"},
    {26, kZEPStatusFileNotFound, "kZEPStatusFileNotFound"},
    {27, kZEPStatusAccessDenied, "kZEPStatusAccessDenied"},
    {28, kZEPStatusNotOverridable, "kZEPStatusNotOverridable"},
    {29, kZEPStatusInvalidGzipFile, "kZEPStatusInvalidGzipFile"},
    {30, kZEPStatusCorruptGzipFile, "kZEPStatusCorruptGzipFile"},
    {31, kZEPStatusNotSupported, "kZEPStatusNotSupported"},
    {32, kZEPStatusValueIsNULL, "kZEPStatusValueIsNULL"},
    {33, kZEPStatusINETNotFound, "kZEPStatusINETNotFound"},
    {34, kZEPStatusConnectionFailed, "kZEPStatusConnectionFailed"},
    {35, kZEPStatusLibCurlFailure, "kZEPStatusLibCurlFailure"},
    {36, kZEPStatusInvalidFormat, "kZEPStatusInvalidFormat"},
    {37, kZEPStatusContainerMismatch, "kZEPStatusContainerMismatch"},
    {38, kZEPStatusRequiredContextMissing, "kZEPStatusRequiredContextMissing"},
    {39, kZEPStatusVersionMismatch, "kZEPStatusVersionMismatch"},
    {40, kZEPStatusLuzFilecopyFailure, "kZEPStatusLuzFilecopyFailure"},
    {41, kZEPStatusTransferFailure, "kZEPStatusTransferFailure"},
    {42, kZEPStatusCimomConnectFailure, "kZEPStatusCimomConnectFailure"},
    {43, fdrStatusEnd, "fdrStatusEnd"},
};

TEST(TZEPStatusCodeTest, EveryCodeHasItsNumberAndItsNameAsText) {
  int expected = 0;
  for (TRow const& row : kAllCodes) {
    SCOPED_TRACE(row.fName);
    EXPECT_EQ(row.fValue, expected++);
    EXPECT_EQ(static_cast<int>(row.fCode), row.fValue);
    EXPECT_EQ(TZEPStatusCode(row.fCode).TranslateStatusCode(), row.fName);
    EXPECT_STREQ(TZEPException(row.fCode).what(), row.fName);
  }
  EXPECT_EQ(expected, 44);
}

TEST(TZEPStatusCodeTest, ConvertsFromAnEnumeratorAndComparesWithOne) {
  TZEPStatusCode const code = kZEPStatusNotFound;
  EXPECT_TRUE(code == kZEPStatusNotFound);
  EXPECT_TRUE(kZEPStatusNotFound == code);
  EXPECT_TRUE(code != kZEPStatusFail);
  EXPECT_FALSE(code != TZEPStatusCode(kZEPStatusNotFound));
  EXPECT_EQ(code.GetCode(), kZEPStatusNotFound);
  static_assert(sizeof(TZEPStatusCode) == 4 && std::is_signed_v<std::underlying_type_t<EZEPStatusCode>>);
}

TEST(TZEPStatusCodeTest, ConvertsFromANumber) {
  EXPECT_EQ(TZEPStatusCode(15), kZEPStatusNotFound);
  EXPECT_STREQ(TZEPException(15).what(), "kZEPStatusNotFound");
}

TEST(TZEPStatusCodeTest, TextIsTheSameObjectOnEachCall) {
  EXPECT_EQ(&TZEPStatusCode(kZEPStatusFail).TranslateStatusCode(), &TZEPStatusCode(kZEPStatusFail).TranslateStatusCode());
}

TEST(TZEPExceptionTest, ConvertsFromAnEnumeratorOrAStatusCodeAndCopies) {
  TZEPException const fromEnumerator(kZEPStatusTypeMismatch);
  TZEPException const fromCode{TZEPStatusCode(kZEPStatusTypeMismatch)};
  TZEPException const copy(fromCode);
  EXPECT_TRUE(fromEnumerator.GetStatusCode() == kZEPStatusTypeMismatch);
  EXPECT_TRUE(copy.GetStatusCode() == kZEPStatusTypeMismatch);
  EXPECT_STREQ(copy.what(), "kZEPStatusTypeMismatch");
}

TEST(TZEPExceptionTest, IsCaughtAsAStandardException) {
  try {
    throw TZEPException(kZEPStatusValueIsNULL);
  } catch (std::exception const& thrown) {
    EXPECT_STREQ(thrown.what(), "kZEPStatusValueIsNULL");
    return;
  }
}

TEST(TBoostAssertExceptionTest, CarriesItsMessage) {
  static_assert(std::is_convertible_v<TBoostAssertException*, std::exception*>);
  static_assert(std::is_convertible_v<TZEPException*, std::exception*>);
  EXPECT_STREQ(TBoostAssertException("the message").what(), "the message");
}

}  // namespace
}  // namespace NQRVZEP20
