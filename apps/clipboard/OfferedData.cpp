#include "apps/clipboard/OfferedData.h"

#include <algorithm>
#include <utility>

OfferedData::OfferedData(std::vector<apps::ClipboardItem> items)
    : _items(std::move(items))
{
}

QStringList OfferedData::formats() const
{
    QStringList types;
    for (const apps::ClipboardItem& item : _items)
        types.append(QString::fromStdString(item.type));
    return types;
}

QVariant OfferedData::retrieveData(const QString& type, QMetaType) const
{
    const std::string wanted = type.toStdString();
    const auto found = std::find_if(
        _items.begin(), _items.end(), [&](const apps::ClipboardItem& item) { return item.type == wanted; });
    return found == _items.end() ? QVariant() : QVariant(QByteArray::fromStdString(found->bytes));
}
