#include "sgcore/containers/sgtarray.h"
#include "sgcore/containers/sgtsimplearray.h"
#include "sgcore/containers/sgtsortedarray.h"
#include "sgcore/containers/sgtstack.h"

#include <QRegularExpression>
#include <QStringList>
#include <gtest/gtest.h>

#include <climits>

namespace {

QStringList capturedWarnings;

void captureMessage(QtMsgType type, const QMessageLogContext &, const QString &message) {
    if (type == QtWarningMsg)
        capturedWarnings.append(message);
}

// Collects the Qt warnings issued during its lifetime.
class WarningCapture {
public:
    WarningCapture() {
        capturedWarnings.clear();
        m_previous = qInstallMessageHandler(captureMessage);
    }
    ~WarningCapture() { qInstallMessageHandler(m_previous); }
    QStringList take() {
        QStringList result = capturedWarnings;
        capturedWarnings.clear();
        return result;
    }

private:
    QtMessageHandler m_previous = nullptr;
};

// Checks that `warnings` is exactly one "<file>(<line>): <message>" naming `header`.
void expectOneWarning(const QStringList &warnings, const char *header, const QString &message) {
    ASSERT_EQ(warnings.size(), 1) << warnings.join('\n').toStdString();
    const QRegularExpression pattern(QStringLiteral("^.*%1\\((\\d+)\\): (.*)$")
                                         .arg(QRegularExpression::escape(QString(header))));
    const auto match = pattern.match(warnings.first());
    ASSERT_TRUE(match.hasMatch()) << warnings.first().toStdString();
    EXPECT_GT(match.captured(1).toInt(), 0);
    EXPECT_EQ(match.captured(2), message);
}

} // namespace

TEST(SgTArray, AppendFindRemoveKeepOrder) {
    SgTArray<int> array(8);
    for (int i = 0; i < 20; ++i)
        EXPECT_EQ(array.append(i * 10), i);
    EXPECT_EQ(array.count(), 20);
    EXPECT_EQ(array.find(70), 7);
    EXPECT_EQ(array.find(5), -1);

    EXPECT_TRUE(array.removeByIndex(0, 1));
    EXPECT_EQ(array[0], 10);
    EXPECT_TRUE(array.removeByIndex(5, 3));
    EXPECT_EQ(array.count(), 16);
    EXPECT_EQ(array[4], 50);
    EXPECT_EQ(array[5], 90);
    EXPECT_TRUE(array.removeByIndex(15, 1));
    EXPECT_EQ(array.count(), 15);
    EXPECT_EQ(array[14], 180);

    EXPECT_EQ(array.addSpace(3), 15);
    EXPECT_EQ(array.count(), 18);
    EXPECT_EQ(array[17], 0);
}

TEST(SgTArray, MisuseWarnsAndLeavesArrayUnchanged) {
    WarningCapture capture;
    SgTArray<int> array;
    array.append(1);
    array.append(2);

    array[2] = 99;
    expectOneWarning(capture.take(), "sgtarray.h",
                     QStringLiteral("Index out of range in SgTArray::operator[]"));
    EXPECT_EQ(array[-1], 0);
    expectOneWarning(capture.take(), "sgtarray.h",
                     QStringLiteral("Index out of range in SgTArray::operator[]"));

    EXPECT_FALSE(array.removeByIndex(2, 1));
    expectOneWarning(
        capture.take(), "sgtarray.h",
        QStringLiteral("Invalid starting index specified in SgTArray::removeByIndex()"));
    EXPECT_FALSE(array.removeByIndex(1, 2));
    expectOneWarning(
        capture.take(), "sgtarray.h",
        QStringLiteral("Too many items specified for removal in SgTArray::removeByIndex()"));
    EXPECT_EQ(array.addSpace(-4), -1);
    expectOneWarning(capture.take(), "sgtarray.h",
                     QStringLiteral("Invalid size '-4' passed to SgTArray::addSpace()"));

    ASSERT_EQ(array.count(), 2);
    EXPECT_EQ(array[0], 1);
    EXPECT_EQ(array[1], 2);
    EXPECT_TRUE(capture.take().isEmpty());
}

TEST(SgTSortedArray, KeepsOrderFindsAndWarns) {
    WarningCapture capture;
    SgTSortedArray<int> sorted;
    for (int value : {5, 1, 9, 3, 5, 7})
        sorted.add(value);
    ASSERT_EQ(sorted.count(), 6);
    const int expected[] = {1, 3, 5, 5, 7, 9};
    for (int i = 0; i < 6; ++i)
        EXPECT_EQ(sorted[i], expected[i]);
    EXPECT_EQ(sorted.find(5), 2);
    EXPECT_EQ(sorted.find(4), -1);
    EXPECT_TRUE(sorted.remove(5));
    EXPECT_EQ(sorted.find(5), 2);
    EXPECT_FALSE(sorted.removeByIndex(3, 5));
    EXPECT_TRUE(capture.take().isEmpty());

    EXPECT_EQ(sorted[5], 0);
    expectOneWarning(capture.take(), "sgtsortedarray.h",
                     QStringLiteral("Index out of range in SgTSortedArray::operator[]"));
}

TEST(SgTSimpleArray, IndexesAndWarns) {
    WarningCapture capture;
    SgTSimpleArray<float> values(3);
    values[1] = 2.5f;
    EXPECT_EQ(values.append(4.0f), 3);
    EXPECT_EQ(values.find(2.5f), 1);
    EXPECT_TRUE(capture.take().isEmpty());

    values[4] = 1.0f;
    expectOneWarning(capture.take(), "sgtsimplearray.h",
                     QStringLiteral("Illegal array index in SgTSimpleArray::operator[]"));
    EXPECT_EQ(values.count(), 4);
    EXPECT_EQ(values[3], 4.0f);
}

TEST(SgTStack, PushPopAndMisuse) {
    WarningCapture capture;
    SgTStack<int> stack(4);
    for (int i = 0; i < 10; ++i)
        EXPECT_TRUE(stack.push(i));
    EXPECT_EQ(stack.top(), 9);
    for (int i = 9; i >= 0; --i)
        EXPECT_EQ(stack.pop(), i);
    EXPECT_TRUE(capture.take().isEmpty());

    EXPECT_EQ(stack.pop(), 0);
    expectOneWarning(capture.take(), "sgtstack.h",
                     QStringLiteral("Empty stack in SgTStack::pop()"));

    struct Big {
        char bytes[1 << 20];
    };
    SgTStack<Big> huge(INT_MAX);
    EXPECT_FALSE(huge.addBlocks(INT_MAX));
    expectOneWarning(capture.take(), "sgtstack.h",
                     QStringLiteral("Out of memory in SgTStack::addBlocks"));
    EXPECT_TRUE(huge.isEmpty());
}
