#include "sharedsource/engine/sgmorphloadlog.h"

#include <gtest/gtest.h>

TEST(MorphLoadLog, EmptyLogRendersBareReportWithoutProblems) {
    SgMorphLoadLog log;
    EXPECT_FALSE(log.hasProblems());
    EXPECT_EQ(log.toHtml(), QString("<HTML><HEAD></HEAD><BODY>\n</BODY>"));
}

TEST(MorphLoadLog, EntriesKeepOrderPrefixAndUnescapedText) {
    SgMorphLoadLog log;
    log.addMessage("a");
    EXPECT_FALSE(log.hasProblems());
    log.addWarning("b");
    EXPECT_TRUE(log.hasProblems());
    log.addError("<i>c</i>");
    log.addMessage("d");
    EXPECT_EQ(log.toHtml(), QString("<HTML><HEAD></HEAD><BODY>"
                                    "\na<BR>"
                                    "\n<FONT COLOR=#0000ff>Warning: </FONT>b<BR>"
                                    "\n<FONT COLOR=#ff0000>Error: </FONT><i>c</i><BR>"
                                    "\nd<BR>"
                                    "\n</BODY>"));

    SgMorphLoadLog errorsOnly;
    errorsOnly.addError("x");
    EXPECT_TRUE(errorsOnly.hasProblems());
}
