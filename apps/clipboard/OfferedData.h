#pragma once

#include "apps/common/ClipboardOffer.h"

#include <QMimeData>

#include <vector>

/// What an X clipboard offers: these types with their bytes as they are. The toolkit's own container would turn text
/// and URIs into its own kinds of values and back, which bytes that are no UTF-8 do not survive.
class OfferedData final : public QMimeData {
public:
    explicit OfferedData(std::vector<apps::ClipboardItem> items);

    QStringList formats() const override;

protected:
    QVariant retrieveData(const QString& type, QMetaType wanted) const override;

private:
    const std::vector<apps::ClipboardItem> _items;
};
