// SPDX-License-Identifier: MIT
#include <tavicore/error.h>
#include <tavicore/file.h>
#include <taviwireless/usbmodem_list.h>

#include <algorithm>

#include "common/log.h"
#include "common/sz_list.h"
#include "usbmodem/info_file.h"
#include "usbmodem/rules/paths.h"

namespace taviwireless::usbmodem_lib {

namespace {

bool IsPluggedIn(const USBModem& modem) {
    return modem.IsInfoExist() && IsTrustedInfo(InfoPath(static_cast<int>(modem.GetIfid())));
}

}  // namespace

USBModemNull USBModemList::nullObject;

USBModemList::USBModemList() = default;

USBModemList::~USBModemList() = default;

int USBModemList::SearchInfoPath() {
    SzList names(1024);
    if (!names) {
        TAVI_LOG_ERROR("Failed to alloc for pFolderList");
        VEXACErrSet(VEXAC_ERR_OUT_OF_MEMORY);
        return -1;
    }
    if (VEXACFileEnumDir(kInfoDirectory, kInfoName, names.Address(), VEXAC_ENUM_FILES) < 0) {
        TAVI_LOG_ERROR("Failed to enum all files under %s", kInfoDirectory);
        return -1;
    }
    if (names.Count() < 0) {
        TAVI_LOG_ERROR("number of file grep from %s: %d", kInfoDirectory, names.Count());
        return -1;
    }
    for (int i = 0; i < names.Count(); ++i) {
        const std::optional<int> interfaceId = InterfaceIdIn(names[i], kInfoName);
        if (interfaceId && FindUSBModem(*interfaceId).IsNull() &&
            IsTrustedInfo(InfoPath(*interfaceId))) {
            records_.emplace_back(*interfaceId, InfoPath(*interfaceId));
        }
    }
    return 0;
}

void USBModemList::DropUnplugged() {
    // The record that moves into a freed place is not looked at until the next call. Compatible
    // with clients that see modems go one by one.
    for (size_t i = 0; i < records_.size(); ++i) {
        if (!IsPluggedIn(records_.at(i))) {
            records_.erase(records_.begin() + static_cast<std::ptrdiff_t>(i));
        }
    }
}

void USBModemList::Drop(int interfaceId) {
    const auto has = [interfaceId](const USBModem& modem) {
        return modem.GetIfid() == static_cast<unsigned int>(interfaceId);
    };
    records_.erase(std::remove_if(records_.begin(), records_.end(), has), records_.end());
}

int USBModemList::Update() {
    if (SearchInfoPath() != 0) {
        TAVI_LOG_ERROR("Failed to search info path");
        return -1;
    }
    DropUnplugged();
    for (USBModem& modem : records_) {
        if (!modem.IsInited() && modem.InitInfo() < 0) {
            TAVI_LOG_ERROR("Failed to init info [%d]", static_cast<int>(modem.GetIfid()));
            return -1;
        }
    }
    return 0;
}

USBModem& USBModemList::FindUSBModem(const std::string& devId) {
    for (USBModem& modem : records_) {
        if (modem.GetDevId() == devId) {
            return modem;
        }
    }
    return nullObject;
}

USBModem& USBModemList::FindUSBModem(int interfaceId) {
    for (USBModem& modem : records_) {
        if (modem.GetIfid() == static_cast<unsigned int>(interfaceId)) {
            return modem;
        }
    }
    return nullObject;
}

}  // namespace taviwireless::usbmodem_lib
