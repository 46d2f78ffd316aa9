-- The update database: the shipped files with their checksums, and the release that they belong to. Runs once in an empty
-- database, on the embedded engine and on SQL Server.

-- tmpdel is the file's checksum, encrypted; content the file itself, needed of the update program alone.
create table sysfile (
  fileName nvarchar(255) not null,
  tmpadd nvarchar(1000) null,
  tmpdel nvarchar(1000) null,
  tmpspec nvarchar(1000) null,
  tmpdesc nvarchar(1000) null,
  tmpent nvarchar(1000) null,
  content image null,
  updtime datetime null default getdate(),
  primary key (fileName)
)
go

create table updateInfo (
  version nvarchar(20) null,
  build nvarchar(50) null
)
go

insert into updateInfo (version, build) values ('8.1', '1')
go
