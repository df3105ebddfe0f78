empty data
od -A d -t x1z data
