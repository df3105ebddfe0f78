printf '\024\0\0\0_record-file-version\3\0\0\0002.0' > file   # the version: 31 bytes
printf '\3\0\0\0red\4\0\0\0fire' >> file                      # "red": 4 + 3 + 4 + 4 bytes
damaged file
echo "- two bytes of the value are left"
head -c 44 file > cut && damaged cut
echo "- two bytes of the value's length are left"
head -c 40 file > cut && damaged cut
echo "- two bytes of the key's length are left"
head -c 33 file > cut && damaged cut
echo "- whole, but without a version"
tail -c +32 file > bare && damaged bare
echo "- without a version, and two bytes of the value are left"
head -c 13 bare > cut && damaged cut
echo "- no file"
damaged missing
