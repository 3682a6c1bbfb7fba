// The host's array that the bridge keeps its send list in: order kept through appends and
// removals, and misuse that warns (naming the header and line) and leaves the array as it was.
#include "sgcore/containers/sgtarray.h"

#include <QRegularExpression>
#include <QStringList>
#include <gtest/gtest.h>

#include <vector>

TEST(SgTArray, KeepsOrderAndRefusesMisuse) {
    static QStringList warnings;
    const QtMessageHandler previous =
        qInstallMessageHandler([](QtMsgType type, const QMessageLogContext &, const QString &text) {
            if (type == QtWarningMsg)
                warnings.append(text);
        });
    SgTArray<int> array(8);
    for (int i = 0; i < 20; ++i)
        EXPECT_EQ(array.append(i * 10), i);
    EXPECT_EQ(array.find(70), 7);
    EXPECT_EQ(array.find(5), -1);
    EXPECT_TRUE(array.removeByIndex(0, 1));
    EXPECT_TRUE(array.removeByIndex(5, 3));
    EXPECT_TRUE(array.removeByIndex(15, 1));
    EXPECT_EQ(array.addSpace(3), 15);
    EXPECT_EQ(std::vector<int>(array.begin(), array.end()),
              (std::vector<int>{10, 20, 30, 40, 50, 90, 100, 110, 120, 130, 140, 150, 160, 170, 180,
                                0, 0, 0}));
    EXPECT_TRUE(warnings.isEmpty()) << warnings.join('\n').toStdString();

    SgTArray<int> pair;
    pair.append(1);
    pair.append(2);
    pair[2] = 99;
    EXPECT_EQ(pair[-1], 0);
    EXPECT_FALSE(pair.removeByIndex(2, 1));
    EXPECT_FALSE(pair.removeByIndex(1, 2));
    EXPECT_EQ(pair.addSpace(-4), -1);
    EXPECT_EQ(std::vector<int>(pair.begin(), pair.end()), (std::vector<int>{1, 2}));
    qInstallMessageHandler(previous);
    // One warning per misuse, in order, each "<file>(<line>): <message>" naming the header.
    QStringList messages;
    for (const QString &warning : warnings) {
        const auto match =
            QRegularExpression(QStringLiteral("^.*sgtarray\\.h\\([1-9]\\d*\\): (.*)$"))
                .match(warning);
        EXPECT_TRUE(match.hasMatch()) << warning.toStdString();
        messages << match.captured(1);
    }
    EXPECT_EQ(messages, (QStringList{
                            "Index out of range in SgTArray::operator[]",
                            "Index out of range in SgTArray::operator[]",
                            "Invalid starting index specified in SgTArray::removeByIndex()",
                            "Too many items specified for removal in SgTArray::removeByIndex()",
                            "Invalid size '-4' passed to SgTArray::addSpace()",
                        }));
}
